// SPDX-License-Identifier: MIT
#include "Trial.hpp"

#include <algorithm>
#include <chrono>
#include <cstdlib>
#include <filesystem>
#include <utility>
#include <vector>

#include <gtest/gtest.h>
#include <unistd.h>

#include "support/Descriptors.hpp"
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

/// So that, whenever they are copied, it does not depend on the second which of them the library
/// has to look at twice.
void dateIntoTheFuture(const GitRepository &repository)
{
    const auto future = fs::file_time_type::clock::now() + std::chrono::hours(24 * 365);
    for (fs::recursive_directory_iterator entry(repository.path()), end; entry != end; ++entry)
    {
        if (entry->path().filename() == ".git")
            entry.disable_recursion_pending();
        else if (!entry->is_symlink() && entry->is_regular_file())
            fs::last_write_time(entry->path(), future);
    }
    repository.tryGit({"update-index", "-q", "--unmerged", "--refresh"});
}

bool begins(const std::string &text, const std::string &beginning)
{
    return text.compare(0, beginning.size(), beginning) == 0;
}

bool isDone(const std::string &outcome)
{
    return begins(outcome, "done");
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
    dateIntoTheFuture(repository_);
    copyTree(folder_ / "subject", folder_ / "saved");
    normalOutcome_ = outcomeOf(begin());
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
    return line({"status", "--porcelain=v2", "--untracked-files=all"}) +
           line({"ls-files", "--stage"}) + line({"symbolic-ref", "HEAD"}) +
           line({"for-each-ref", "--format=%(refname) %(tree)"}) +
           line({"log", "--all", "--format=%s, %an, %T"}) +
           line({"log", "--all", "--merges", "--format=%s"}) + line({"rev-parse", "MERGE_HEAD"}) +
           GitRepository(home_).read(".gitconfig");
}

void Trial::expectSound() const
{
    std::vector<fs::path> repositories{repository_.path()};
    if (fs::exists(folder_ / "subject/origin"))
        repositories.push_back(folder_ / "subject/origin");
    for (const auto &path : repositories)
    {
        const auto checked =
            GitRepository(path).tryGit({"fsck", "--strict", "--no-dangling", "--no-progress"});
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
    const bool isFileInConflict = begins(operation_.name, "merge") &&
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
    for (const auto &entry : fs::recursive_directory_iterator(folder_ / "subject"))
    {
        // A fetch works over this one.
        if (isLeftByLibGit2(entry.path()) && entry.path().filename() != "FETCH_HEAD.lock")
            left.push_back(entry.path());
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
    EXPECT_TRUE(begins(outcome, operation_.refusal)) << outcome;
    for (const auto &command : operation_.clearing)
        repository_.git(command);
    outcome = outcomeOf(action);
    EXPECT_EQ(outcome, normalOutcome_);
}

} // namespace vclink::test
