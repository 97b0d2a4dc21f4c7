// SPDX-License-Identifier: MIT
#include "Twins.hpp"

#include <exception>
#include <sstream>

#include <boost/variant/get.hpp>
#include <gtest/gtest.h>

#include "foundation/core/except/IMsgIDException.hpp"
#include "quoting.hpp"
#include "support/RepositoryState.hpp"
#include "support/adapterFor.hpp"
#include "support/text.hpp"
#include "vclink/git/GitException.hpp"
#include "vclink/git/LibGit2Exception.hpp"

namespace vclink::test
{
namespace
{

namespace fs = std::filesystem;

void replaceAll(std::string &text, const std::string &from, const std::string &to)
{
    for (std::size_t at = 0; (at = text.find(from, at)) != std::string::npos; at += to.size())
    {
        text.replace(at, from.size(), to);
    }
}

std::string makeStream(const std::string &branch, const std::vector<PlannedFile> &files)
{
    std::string stream = "commit refs/heads/" + branch +
                         "\ncommitter A <a@example.com> 1577836800 +0000\n" +
                         asFastImportData("aside") + "from HEAD^0\n";
    for (const auto &file : files)
    {
        stream += file.mode.empty() ? "D " + quote(file.path) + '\n'
                                    : "M " + file.mode + " inline " + quote(file.path) + '\n' +
                                          asFastImportData(file.content);
    }
    return stream;
}

} // namespace

Twins::Twins(const fs::path &folder)
    : library_(folder / "library"), git_(folder / "git"),
      adapter_(adapterFor(library_.repository())), model_(git_.repository())
{
}

void Twins::begin(const std::vector<PlannedFile> &files)
{
    for (auto *twin : {&library_, &git_})
    {
        twin->maker.write(".git/info/exclude", "*.log\nignored*\nbuild/\n");
        if (!files.empty())
        {
            twin->maker.import(files, {});
            twin->maker.checkOut();
        }
    }
    compare();
}

void Twins::edit(const std::function<void(WorkingCopyMaker &maker)> &change)
{
    change(library_.maker);
    change(git_.maker);
    reportIsOld_ = true;
}

std::string Twins::add(const Names &names)
{
    note("addFiles", names);
    return change([&](CMAdapter &adapter) { adapter.addFiles(inRoot(names)); },
                  [&](ChangeModel &model) { return model.add(names); });
}

std::string Twins::remove(const Names &names)
{
    note("removeFiles", names);
    return change([&](CMAdapter &adapter) { adapter.removeFiles(inRoot(names)); },
                  [&](ChangeModel &model) { return model.remove(names); });
}

std::string Twins::revert(const Names &names)
{
    note("revertFiles", names);
    return change([&](CMAdapter &adapter) { adapter.revertFiles(inRoot(names)); },
                  [&](ChangeModel &model) { return model.revert(names); });
}

std::string Twins::markResolved(const std::string &name)
{
    note("markResolved", {name});
    return change([&](CMAdapter &adapter) { adapter.markResolved(inRoot(name)); },
                  [&](ChangeModel &model) { return model.markResolved(name); });
}

std::string Twins::commit(const std::string &message)
{
    note("commit", {message});
    const auto byLibrary = [&](CMAdapter &adapter)
    {
        try
        {
            adapter.commit(upath(), asUtf16(message));
        }
        catch (const git::LibGit2Exception &exception)
        {
            // A merge of which nothing was kept: intended here, and git commits it.
            const std::string text = asUtf8(exception.getError().getMessage());
            if (text.find("run: git commit") == std::string::npos)
                throw;
            ChangeModel(library_.repository()).commit(message);
        }
    };
    return change(byLibrary, [&](ChangeModel &model) { return model.commit(message); });
}

void Twins::branch(const std::string &name, const std::vector<PlannedFile> &files)
{
    for (const auto &file : files)
    {
        library_.maker.note("on branch " + name + ": " +
                            (file.mode.empty() ? "delete " : file.mode + " ") + quote(file.path) +
                            " with " + quote(file.content));
    }
    for (auto *twin : {&library_, &git_})
    {
        twin->repository()
            .command({"fast-import", "--quiet"})
            .input(makeStream(name, files))
            .runOrThrow();
        describeHead(*twin, ".git/refs/heads/" + name);
    }
}

bool Twins::merge(const std::string &branch)
{
    library_.maker.note("git merge --no-commit --no-ff " + branch);
    const std::vector<std::string> arguments{"merge", "--no-commit", "--no-ff", "--quiet", branch};
    const CommandResult result = library_.repository().tryGit(arguments);
    EXPECT_EQ(git_.repository().tryGit(arguments).exitStatus, result.exitStatus) << result.errors;
    compare();
    return result.succeeded();
}

std::string Twins::switchTo(const std::string &branch)
{
    note("switchBranch", {branch});
    return tryChange([&branch](git::BranchManager &branches) { branches.switchBranch(branch); },
                     {"switch", "--quiet", branch});
}

std::string Twins::mergeByLibrary(const std::string &branch)
{
    note("merge", {branch});
    return tryChange([&branch](git::BranchManager &branches) { branches.merge(branch); },
                     {"merge", "--quiet", "--no-edit", branch});
}

std::string Twins::tryChange(const std::function<void(git::BranchManager &branches)> &byLibrary,
                             const std::vector<std::string> &byGit)
{
    const fs::path &copy = library_.repository().path();
    const Snapshot before = takeSnapshot(copy, copy);
    const auto kept = worthKeeping(before);
    std::string raised;
    try
    {
        byLibrary(*git::BranchManager::create(*adapter_));
    }
    catch (const git::GitException &exception)
    {
        raised = asUtf8(exception.GetUnicodeMessageTxt());
    }
    const Snapshot after = takeSnapshot(copy, copy);
    for (const auto &id : lostOf(kept, after, copy))
        ADD_FAILURE() << id << " is lost\n" << differenceOf(before, after);
    const bool isRefused = !raised.empty() && !isMerging();
    if (isRefused)
    {
        EXPECT_EQ(changeOf(before, after), "") << "refused with " << raised;
    }
    const bool isRefusedByGit = !git_.repository().tryGit(byGit).succeeded();
    const bool isAlike = areAlike();
    if (!isAlike)
        adopt();
    compare();
    const std::string outcome = isRefused ? "refused" : "done";
    return outcome + (isAlike ? "" : isRefusedByGit ? ", by git refused" : ", by git otherwise");
}

std::set<std::string> Twins::worthKeeping(const Snapshot &before)
{
    const GitReport &known = report();
    std::set<std::string> ids = before.indexIds;
    for (const auto &[name, id] : before.fileIds)
        if (known.count(name) == 1)
            ids.insert(id);
    return ids;
}

bool Twins::areAlike()
{
    const auto look = [](const Twin &twin)
    {
        Snapshot snapshot = takeSnapshot(twin.repository().path(), twin.repository().path());
        // Ids differ by the time of their making.
        snapshot.history.clear();
        return snapshot;
    };
    const std::string &head = ".git/HEAD";
    return differenceOf(look(library_), look(git_)).empty() &&
           library_.repository().read(head) == git_.repository().read(head) &&
           describeHead(library_, headFile()) == describeHead(git_, headFile());
}

void Twins::adopt()
{
    describeHead(library_, headFile());
    library_.repository().copyTo(git_.repository().path());
    git_.commits = library_.commits;
}

std::string Twins::change(const std::function<void(CMAdapter &adapter)> &byLibrary,
                          const std::function<std::string(ChangeModel &model)> &byGit)
{
    report();
    const std::string expected = byGit(model_);
    EXPECT_EQ(outcomeOf([&] { byLibrary(*adapter_); }), expected);
    compare();
    return expected.substr(0, expected.find('\n'));
}

const GitReport &Twins::report()
{
    if (reportIsOld_)
    {
        model_.refreshStatus();
        reportIsOld_ = false;
    }
    return model_.report();
}

bool Twins::hasCommit() const
{
    return fs::exists(library_.repository() / headFile());
}

bool Twins::isMerging() const
{
    return fs::exists(library_.repository() / ".git/MERGE_HEAD");
}

void Twins::checkIntegrity() const
{
    const CommandResult result = library_.repository().tryGit({"fsck", "--strict"});
    EXPECT_TRUE(result.succeeded()) << result.errors;
}

void Twins::compare()
{
    model_.refresh();
    reportIsOld_ = false;
    EXPECT_EQ(listIndex(library_.repository()), model_.index());
    EXPECT_EQ(runGitStatus(library_.repository()), model_.status());
    EXPECT_EQ(workingTreeOf(library_.repository()), workingTreeOf(git_.repository()));
    EXPECT_EQ(library_.repository().read(".git/HEAD"), git_.repository().read(".git/HEAD"));
    EXPECT_EQ(describeHead(library_, headFile()), describeHead(git_, headFile()));
    for (const auto *name : {".git/MERGE_HEAD", ".git/MERGE_MSG", ".git/index.lock"})
    {
        EXPECT_EQ(fs::exists(library_.repository() / name), fs::exists(git_.repository() / name))
            << name;
    }
    EXPECT_EQ(statesOfAll(*adapter_), model_.states());
}

std::string Twins::headFile() const
{
    const std::string head = library_.repository().read(".git/HEAD");
    return ".git/" + head.substr(5, head.size() - 6);
}

/// The commit that a branch names: tree, parents, author and message, as far as both can agree. The
/// time is not looked at, nor an encoding, which git leaves out when it is UTF-8.
std::string Twins::describeHead(Twin &twin, const std::string &reference)
{
    if (!fs::exists(twin.repository() / reference))
    {
        return "none";
    }
    const std::string id = twin.repository().read(reference).substr(0, 40);
    const auto known = twin.commits.find(id);
    if (known != twin.commits.end())
    {
        return known->second;
    }
    std::istringstream commit(twin.repository().git({"cat-file", "commit", id}));
    std::string description = "commit " + std::to_string(twin.commits.size());
    for (std::string line; std::getline(commit, line) && !line.empty();)
    {
        const std::string key = line.substr(0, line.find(' '));
        const std::string value = line.substr(key.size() + 1);
        if (key == "parent")
        {
            const auto parent = twin.commits.find(value);
            const bool seen = parent != twin.commits.end();
            description += "\nparent " + (seen ? parent->second.substr(0, parent->second.find('\n'))
                                               : "that was not seen");
        }
        else if (key != "encoding")
        {
            description += '\n' + key + ' ' + value.substr(0, value.find('>'));
        }
    }
    description += "\n\n" + commit.str().substr(commit.str().find("\n\n"));
    twin.commits.emplace(id, description);
    return description;
}

std::string Twins::outcomeOf(const std::function<void()> &action) const
{
    try
    {
        action();
        return {};
    }
    catch (const foundation::core::except::IMsgIDException &exception)
    {
        const auto &message = exception.GetBaseMsgIDObj();
        std::string text = message.getKey();
        for (const auto &argument : message.getArguments())
        {
            const auto *const report = boost::get<ustring>(&argument);
            text += '\n' + (report != nullptr ? asUtf8(*report) : std::string("?"));
        }
        replaceAll(text, '\n' + library_.repository().path().string() + '/', "\n");
        return text;
    }
    catch (const std::exception &exception)
    {
        return exception.what();
    }
}

upath Twins::inRoot(const std::string &name) const
{
    return asPath((library_.repository() / name).string());
}

std::vector<upath> Twins::inRoot(const Names &names) const
{
    std::vector<upath> paths;
    for (const auto &name : names)
    {
        paths.push_back(inRoot(name));
    }
    return paths;
}

void Twins::note(const std::string &verb, const Names &names)
{
    std::string line = verb;
    for (const auto &name : names)
    {
        line += ' ' + quote(name);
    }
    library_.maker.note(line);
}

} // namespace vclink::test
