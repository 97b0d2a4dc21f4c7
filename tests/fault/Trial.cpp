// SPDX-License-Identifier: MIT
#include "Trial.hpp"

#include <algorithm>
#include <array>
#include <cstdlib>
#include <filesystem>
#include <iterator>
#include <utility>
#include <vector>

#include <gtest/gtest.h>
#include <unistd.h>

#include "support/Descriptors.hpp"
#include "support/readFile.hpp"
#include "support/strings.hpp"
#include "support/text.hpp"

namespace vclink::test
{
namespace
{

namespace fs = std::filesystem;

/// Objects, which nobody writes to, are linked: this runs before every fault.
void copyTree(const fs::path &source, const fs::path &target)
{
    fs::remove_all(target);
    fs::create_directories(target);
    for (const auto &entry : fs::directory_iterator(source))
    {
        const fs::path copy = target / entry.path().filename();
        const bool isFolder = !entry.is_symlink() && entry.is_directory();
        if (isFolder && entry.path().filename() != "objects")
            copyTree(entry.path(), copy);
        else if (isFolder)
            fs::copy(entry.path(), copy,
                     fs::copy_options::recursive | fs::copy_options::create_hard_links);
        else
            fs::copy(entry.path(), copy, fs::copy_options::copy_symlinks);
    }
}

bool isDone(const std::string &outcome)
{
    return startsWith(outcome, "done");
}

/// What writes more than objects, and what moves references.
constexpr std::array callsThatWrite{"git_checkout_index", "git_checkout_tree",
                                    "git_clone",          "git_config_set_string",
                                    "git_index_write",    "git_merge",
                                    "git_remote_fetch",   "git_remote_push",
                                    "git_reset_default",  "git_repository_state_cleanup"};
constexpr std::array callsThatMove{
    "git_branch_create",        "git_branch_delete", "git_clone",       "git_commit_create",
    "git_reference_set_target", "git_remote_fetch",  "git_remote_push", "git_repository_set_head"};

template <class Names> bool isAnyOf(const Names &names, const std::string &call)
{
    return std::find(names.begin(), names.end(), call) != names.end();
}

bool isReference(const fs::path &file)
{
    const std::string text = file.string();
    return text.find("/logs/") == std::string::npos &&
           (text.find("/refs/") != std::string::npos || file.filename() == "packed-refs" ||
            file.filename() == "HEAD");
}

/// The reference that HEAD names; nothing if it has a commit's id.
std::string branchAtHead(const GitRepository &repository)
{
    const std::string head = readFile(repository.gitFolder() / "HEAD");
    return startsWith(head, "ref: ") ? head : std::string();
}

/// The id of the commit that a merge under way merges, if there is one.
std::string otherSide(const GitRepository &repository)
{
    return readFile(repository.gitFolder() / "MERGE_HEAD");
}

RepositoryState::Entries referencesIn(const RepositoryState::Entries &files)
{
    RepositoryState::Entries references;
    std::copy_if(files.begin(), files.end(), std::inserter(references, references.end()),
                 [](const auto &file) { return isReference(file.first); });
    return references;
}

} // namespace

bool wantsAllFaults()
{
    return std::getenv("VCLINK_ALL_FAULTS") != nullptr;
}

Trial::Trial(const Operation &operation, fs::path folder, const HermeticEnvironment &environment)
    : operation_(operation), folder_(std::move(folder)), home_(environment.home()),
      repository_(GitRepository::init(folder_ / "subject/repository"))
{
    // For the operations that make an identity of it; the environment is put back by its owner.
    ::setenv("USER", "builder", 1);
    operation_.prepare(repository_);
    copyTree(folder_ / "subject", folder_ / "saved");
    const Action action = begin();
    beginning_ = files();
    normalOutcome_ = outcomeOf(action);
    normalGist_ = gist();
}

Action Trial::begin()
{
    adapter_.reset();
    copyTree(folder_ / "saved", folder_ / "subject");
    GitRepository(home_).write(".gitconfig", "[core]\n\tpreloadIndex = false\n");
    const auto interactor = std::make_shared<TestInteractor>();
    adapter_ = std::make_shared<git::GitAdapter>(
        asPath(repository_.path()), std::static_pointer_cast<ApplicationInteractor>(interactor));
    return operation_.make({repository_, interactor, adapter_});
}

std::string Trial::gist() const
{
    const auto line = [this](const std::vector<std::string> &arguments)
    { return repository_.tryGit(arguments).output; };
    // The graph shows which commits are merges.
    return line({"status", "--porcelain=v2", "--untracked-files=all"}) +
           line({"ls-files", "--stage"}) + line({"for-each-ref", "--format=%(refname) %(tree)"}) +
           line({"log", "--all", "--graph", "--format=%s, %an, %T"}) + branchAtHead(repository_) +
           otherSide(repository_) + GitRepository(home_).read(".gitconfig");
}

RepositoryState::Entries Trial::files() const
{
    auto entries = workingTreeOf(GitRepository(folder_ / "subject"));
    for (auto entry = entries.begin(); entry != entries.end();)
        entry = entry->first.find("/objects/") == std::string::npos ? std::next(entry)
                                                                    : entries.erase(entry);
    entries.emplace("the user's configuration", GitRepository(home_).read(".gitconfig"));
    return entries;
}

void Trial::expectWrittenByThese(const std::vector<std::string> &calls) const
{
    const auto has = [&](const auto &names)
    {
        return std::any_of(calls.begin(), calls.end(),
                           [&](const std::string &call) { return isAnyOf(names, call); });
    };
    if (has(callsThatMove))
        return;
    const auto left = files();
    if (has(callsThatWrite))
    {
        EXPECT_EQ(referencesIn(left), referencesIn(beginning_));
    }
    else
    {
        EXPECT_EQ(left, beginning_);
    }
    // The library writes the other side's id once the merge is written.
    const auto merge = std::find(calls.begin(), calls.end(), "git_merge");
    if (std::find(merge, calls.end(), "git_oid_fmt") != calls.end())
    {
        EXPECT_EQ(otherSide(repository_), repository_.git({"rev-parse", "topic"}));
    }
}

void Trial::expectSound() const
{
    std::vector<fs::path> repositories{repository_.path()};
    if (fs::exists(folder_ / "subject/origin"))
        repositories.push_back(folder_ / "subject/origin");
    for (const auto &path : repositories)
    {
        const auto checked = GitRepository(path).check();
        EXPECT_TRUE(checked.succeeded()) << checked.output << checked.errors;
    }
    for (const auto &entry : fs::recursive_directory_iterator(folder_ / "subject"))
    {
        if (!isLeftByLibGit2(entry.path()))
        {
            EXPECT_NE(entry.path().extension(), ".lock") << entry.path();
            EXPECT_NE(entry.path().filename(), "index.vclink");
            EXPECT_NE(entry.path().filename(), "vclink-merge");
        }
    }
}

bool Trial::isLeftByLibGit2(const fs::path &file) const
{
    const fs::path name = file.filename();
    const bool isFileInConflict = startsWith(operation_.name, "merge") &&
                                  file.parent_path() == repository_.path() &&
                                  name.extension() == ".lock";
    return name == "FETCH_HEAD.lock" || name == "MERGE_MSG.lock" || isFileInConflict;
}

void Trial::closeWhatLibGit2Leaves() const
{
    for (const auto &[descriptor, file] : openDescriptors())
    {
        if (isLeftByLibGit2(file))
            ::close(descriptor);
    }
}

void Trial::removeWhatLibGit2Leaves() const
{
    std::vector<fs::path> left;
    for (const auto &folder : {repository_.path(), repository_.gitFolder()})
    {
        for (const auto &entry : fs::directory_iterator(folder))
        {
            // A fetch works over this one.
            if (isLeftByLibGit2(entry.path()) && entry.path().filename() != "FETCH_HEAD.lock")
                left.push_back(entry.path());
        }
    }
    for (const auto &file : left)
        fs::remove(file);
}

void Trial::expectWorksAgain(const Action &action) const
{
    removeWhatLibGit2Leaves();
    std::string outcome = outcomeOf(action);
    if (isDone(outcome) || outcome == normalOutcome_)
        return;
    EXPECT_FALSE(operation_.refusal.empty()) << outcome;
    EXPECT_TRUE(startsWith(outcome, operation_.refusal)) << outcome;
    for (const auto &command : operation_.clearing)
        repository_.git(command);
    outcome = outcomeOf(action);
    EXPECT_EQ(outcome, normalOutcome_);
}

} // namespace vclink::test
