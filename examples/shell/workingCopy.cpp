// SPDX-License-Identifier: MIT
#include "workingCopy.hpp"

#include <algorithm>
#include <array>
#include <fstream>
#include <optional>
#include <string>
#include <system_error>

#include "failures.hpp"
#include "gitProgram.hpp"
#include "names.hpp"
#include "renames.hpp"
#include "revisions.hpp"
#include "texts.hpp"
#include "vclink/git/BranchManager.hpp"

namespace vclink::shell
{
namespace
{

namespace fs = std::filesystem;

constexpr const char *emptyTree = "4b825dc642cb6eb9a060e54bf8d69288fbee4904";

bool hasFilesInHead(CMAdapter &adapter)
{
    const auto manager = git::BranchManager::create(adapter);
    const std::optional<std::string> tree = findRevision(*manager, "HEAD^{tree}");
    return tree && *tree != emptyTree;
}

/// Whether Git tracks a file, in an index that the library may be unable to read.
bool hasFilesInIndex(const fs::path &root)
{
    // "DIRC", the version, and the number of entries: four bytes each.
    std::array<char, 12> header{};
    std::ifstream index(stateFolder(root) / "index", std::ios::binary);
    return index.read(header.data(), header.size()) &&
           std::any_of(header.begin() + 8, header.end(), [](char byte) { return byte != 0; });
}

/// Whether there is anything that Git could track, and that Git does not keep.
bool hasFilesOnDisk(const fs::path &root)
{
    std::error_code error;
    fs::recursive_directory_iterator entry(root, fs::directory_options::skip_permission_denied,
                                           error);
    for (; !error && entry != fs::recursive_directory_iterator(); entry.increment(error))
    {
        std::error_code ignored;
        if (entry->path().filename() == ".git")
        {
            entry.disable_recursion_pending();
        }
        else if (const fs::file_status status = entry->symlink_status(ignored);
                 fs::is_regular_file(status) || fs::is_symlink(status))
        {
            return true;
        }
    }
    return false;
}

/// Whether git finds nothing to track among the files that it does not track yet; unknown if git is
/// not installed, or can't read the working copy either.
std::optional<bool> areAllIgnored(const fs::path &root)
{
    const auto others = runGit(root, {"ls-files", "-z", "--others", "--exclude-standard"});
    return others ? std::optional(others->empty()) : std::nullopt;
}

/// A question for this file alone can be answered.
bool isGitmodulesInConflict(CMAdapter &adapter)
{
    const upath file(adapter.getRootFolder().string() + u"/.gitmodules");
    const FileStateMap states = adapter.getFileStates({file});
    return !states.empty() && states.begin()->second.getState() == FileState::InConflict;
}

std::string explainUnknownStates(CMAdapter &adapter)
{
    if (isGitmodulesInConflict(adapter))
    {
        return say(
            "The states of the files are not known: .gitmodules is in conflict, and can't be "
            "read before it\nis resolved. Edit it, and mark it with \"vclink-shell "
            "resolved\".");
    }
    return say("The states of the files are not known: libgit2 can't read this working copy. \"git "
               "status\" may\nsay why: an error in .gitmodules, a setting with an invalid value, "
               "a tracked file that you have no\npermission to read, or folders more than 100 "
               "levels deep.");
}

std::string explainNoStates()
{
    return say("No file here has a state: either Git ignores all files, or libgit2 can't read this "
               "working copy,\nfor example because a setting has an invalid value. \"git status\" "
               "may say which.");
}

} // namespace

bool hasGitEntry(const fs::path &folder)
{
    std::error_code ignored;
    return fs::exists(fs::symlink_status(folder / ".git", ignored));
}

fs::path stateFolder(const fs::path &root)
{
    const fs::path place = root / ".git";
    std::ifstream file(place);
    const std::string key = "gitdir: ";
    std::string line;
    const bool isElsewhere = std::getline(file, line) && line.rfind(key, 0) == 0;
    return isElsewhere ? root / line.substr(key.size()) : place;
}

fs::path sharedFolder(const fs::path &state)
{
    std::ifstream file(state / "commondir");
    std::string line;
    return std::getline(file, line) ? state / line : state;
}

void refuseUnreadableHead(CMAdapter &adapter)
{
    if (isHeadUnreadable(*git::BranchManager::create(adapter)))
    {
        throw ShellFailure(
            say("The states of the files are not known: the commit of HEAD, or its tree, can't be "
                "read. \"git fsck\" says\nwhat is missing. If the repository borrows objects from "
                "another one, make that available again."));
    }
}

FileStateMap wholeStates(CMAdapter &adapter)
{
    refuseUnreadableHead(adapter);
    FileStateMap states = folderStates(adapter, adapter.getRootFolder());
    if (states.empty())
    {
        refuseUnknownStates(adapter);
    }
    return states;
}

void refuseUnknownStates(CMAdapter &adapter)
{
    const upath &root = adapter.getRootFolder();
    const fs::path folder = nativePath(root);
    if (!hasGitEntry(folder) || !adapter.getFolderStates(root).empty())
    {
        return;
    }
    if (hasFilesInHead(adapter) || hasFilesInIndex(folder))
    {
        throw ShellFailure(explainUnknownStates(adapter));
    }
    if (!hasFilesOnDisk(folder))
    {
        return;
    }
    const std::optional<bool> areIgnored = areAllIgnored(folder);
    if (!areIgnored.value_or(false))
    {
        throw ShellFailure(areIgnored ? explainUnknownStates(adapter) : explainNoStates());
    }
}

} // namespace vclink::shell
