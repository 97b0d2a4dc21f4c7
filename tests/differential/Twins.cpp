// SPDX-License-Identifier: MIT
#include "Twins.hpp"

#include <exception>
#include <sstream>
#include <stdexcept>

#include <boost/variant/get.hpp>
#include <gtest/gtest.h>

#include "foundation/core/except/IMsgIDException.hpp"
#include "quoting.hpp"
#include "support/RepositoryState.hpp"
#include "support/TestInteractor.hpp"
#include "support/text.hpp"
#include "vclink/git/GitAdapterFactory.hpp"

namespace vclink::test
{
namespace
{

namespace fs = std::filesystem;

const std::string mainBranch = ".git/refs/heads/main";

void runImport(const Command &command)
{
    const CommandResult result = command.run();
    if (!result.succeeded())
    {
        throw std::runtime_error(command.text() + ": " + result.errors);
    }
}

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
                         asFastImportData("aside") + "from refs/heads/main^0\n";
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
      adapter_(git::GitAdapterFactory().createAdapterFor(asPath((folder / "library").string()),
                                                         std::make_shared<TestInteractor>())),
      model_(git_.repository())
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
    return change([&](CMAdapter &adapter) { adapter.commit(upath(), asUtf16(message)); },
                  [&](ChangeModel &model) { return model.commit(message); });
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
        runImport(
            twin->repository().command({"fast-import", "--quiet"}).input(makeStream(name, files)));
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
    return fs::exists(library_.repository() / mainBranch);
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
    EXPECT_EQ(describeHead(library_, mainBranch), describeHead(git_, mainBranch));
    for (const auto *name : {".git/MERGE_HEAD", ".git/MERGE_MSG", ".git/index.lock"})
    {
        EXPECT_EQ(fs::exists(library_.repository() / name), fs::exists(git_.repository() / name))
            << name;
    }
    States states;
    const std::size_t root = library_.repository().path().string().size() + 1;
    for (const auto &[path, state] : adapter_->getFolderStates(adapter_->getRootFolder()))
    {
        states.emplace(asBytes(path).substr(root), state.getState());
    }
    EXPECT_EQ(states, model_.states());
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
