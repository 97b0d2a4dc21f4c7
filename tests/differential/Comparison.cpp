// SPDX-License-Identifier: MIT
#include "Comparison.hpp"

#include <filesystem>
#include <fstream>
#include <sstream>

#include <gtest/gtest.h>
#include <sys/stat.h>

#include "listedNames.hpp"
#include "moves.hpp"
#include "quoting.hpp"
#include "support/adapterFor.hpp"
#include "support/text.hpp"

namespace vclink::test
{
namespace
{

namespace fs = std::filesystem;

/// Everything below a folder, with types, permissions, times of change and bytes.
std::map<std::string, std::string> takeSnapshot(const fs::path &folder)
{
    std::map<std::string, std::string> snapshot;
    for (const auto &entry : fs::recursive_directory_iterator(folder))
    {
        struct stat status = {};
        ::lstat(entry.path().c_str(), &status);
        std::ostringstream text;
        text << status.st_mode << ' ' << status.st_ino << ' ' << status.st_mtim.tv_sec << '.'
             << status.st_mtim.tv_nsec << ' ' << status.st_ctim.tv_sec << '.'
             << status.st_ctim.tv_nsec << ' ';
        if (S_ISREG(status.st_mode))
        {
            text << std::ifstream(entry.path(), std::ios::binary).rdbuf();
        }
        snapshot[entry.path().string()] = text.str();
    }
    return snapshot;
}

std::string describeState(const States &states, const std::string &path)
{
    const auto found = states.find(path);
    return found == states.end() ? "none" : std::to_string(found->second);
}

} // namespace

Comparison::Comparison(const GitRepository &repository, std::uint64_t seed)
    : repository_(repository), random_(seed), root_(repository.path().string()),
      status_(runGitStatus(repository)), report_(readGitReport(repository, status_)),
      blobs_(readBlobs(repository, moveCandidates(report_))), adapter_(adapterFor(repository))
{
}

void Comparison::compareAll()
{
    const auto before = takeSnapshot(root_);
    compareRoot();
    for (const auto &folder : someFolders())
    {
        compareFolder(folder);
    }
    compareFiles();
    EXPECT_EQ(takeSnapshot(root_), before) << "asking changed something";
    EXPECT_EQ(runGitStatus(repository_), status_);
}

void Comparison::compareRoot()
{
    const FileStateMap all = adapter_->getFolderStates(asPath(root_));
    compare("the root", all, [](const std::string &) { return true; });
    for (const auto &[path, state] : all)
    {
        states_.insert(state.getState());
    }
}

void Comparison::compareFolder(const std::string &folder)
{
    compare("the folder " + quote(folder), adapter_->getFolderStates(inRoot(folder)),
            [&folder](const std::string &path) { return isBelow(path, folder); });
}

void Comparison::compareFiles()
{
    const std::vector<std::string> names = someFiles();
    std::string title = "the files";
    std::vector<upath> files;
    for (const auto &name : names)
    {
        title += ' ' + quote(name);
        files.push_back(inRoot(name));
    }
    compare(title, adapter_->getFileStates(files),
            [&names](const std::string &path) { return isMeant(path, names); });
}

void Comparison::compare(const std::string &asked, const FileStateMap &actual,
                         const Selection &isAsked) const
{
    const States expected = expectedStates(report_, blobs_, isAsked);
    const States found = statesByPath(root_, actual);
    if (found != expected)
    {
        ADD_FAILURE() << "asked for " << asked << '\n' << describe(found, expected);
    }
}

std::vector<std::string> Comparison::someFolders()
{
    std::set<std::string> folders;
    for (const auto &[path, file] : report_)
    {
        const std::string folder = fs::path(path).parent_path().string();
        if (!folder.empty() && isPlain(root_, folder) && random_.chance(30))
        {
            folders.insert(folder);
        }
    }
    return {folders.begin(), folders.end()};
}

std::vector<std::string> Comparison::someFiles()
{
    std::vector<std::string> files;
    for (const auto &[path, file] : report_)
    {
        if (isPlain(root_, path) && random_.chance(40))
        {
            files.push_back(path);
        }
    }
    return files;
}

upath Comparison::inRoot(const std::string &path) const
{
    return asPath(root_ + '/' + path);
}

std::string Comparison::describe(const States &found, const States &expected) const
{
    std::set<std::string> paths;
    for (const auto *states : {&found, &expected})
    {
        for (const auto &[path, state] : *states)
        {
            paths.insert(path);
        }
    }
    std::string text;
    for (const auto &path : paths)
    {
        const std::string foundState = describeState(found, path);
        const std::string expectedState = describeState(expected, path);
        if (foundState != expectedState)
        {
            text += "  " + quote(path) + ": found " + foundState + ", expected " + expectedState +
                    ", " + describeReport(path) + '\n';
        }
    }
    return text;
}

std::string Comparison::describeReport(const std::string &path) const
{
    const auto found = report_.find(path);
    if (found == report_.end())
    {
        return "git says nothing";
    }
    const GitFile &file = found->second;
    std::string text = "git says ";
    text += file.index;
    text += file.workTree;
    return text + (file.unmerged ? " unmerged" : "") + (file.untracked ? " untracked" : "");
}

} // namespace vclink::test
