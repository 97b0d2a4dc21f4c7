// SPDX-License-Identifier: MIT
#include "workingCopy.hpp"

#include <fstream>
#include <optional>
#include <string>
#include <system_error>

#include "failures.hpp"
#include "names.hpp"
#include "revisions.hpp"
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
        return "The states of the files are not known: .gitmodules is in conflict, and can't be "
               "read before it\nis resolved. Make it as it should be, and mark it with "
               "\"vclink-shell resolved\".";
    }
    return "The states of the files are not known: libgit2 can't read this working copy. "
           "\"git status\" may\nsay why: a .gitmodules with an error, a setting with a value that "
           "it can't have, or folders\nmore than 100 levels deep.";
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

FileStateMap wholeStates(CMAdapter &adapter)
{
    FileStateMap states = adapter.getFolderStates(adapter.getRootFolder());
    if (states.empty())
    {
        refuseUnknownStates(adapter);
    }
    return states;
}

void refuseUnknownStates(CMAdapter &adapter)
{
    const upath &root = adapter.getRootFolder();
    if (hasGitEntry(nativePath(root)) && hasFilesInHead(adapter) &&
        adapter.getFolderStates(root).empty())
    {
        throw ShellFailure(explainUnknownStates(adapter));
    }
}

} // namespace vclink::shell
