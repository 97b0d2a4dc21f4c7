// SPDX-License-Identifier: MIT
#include <optional>
#include <string>

#include "vclink/CMAdapter.hpp"
#include "vclink/FileStateMap.hpp"
#include "vclink/git/BranchManager.hpp"
#include "vclink/git/LibGit2Exception.hpp"

/// Whether nothing was committed yet.
bool isBeforeFirstCommit(const vclink::git::BranchManager &branches)
{
    constexpr int unborn = -9; // GIT_EUNBORNBRANCH
    try
    {
        branches.getCurrentBranch();
        return false;
    }
    catch (const vclink::git::LibGit2Exception &failure)
    {
        return failure.getError().getCode() == unborn;
    }
}

/// Throws LibGit2Exception if the last commit cannot be read.
bool hasFilesInHead(const vclink::git::BranchManager &branches)
{
    const std::string emptyTree = "4b825dc642cb6eb9a060e54bf8d69288fbee4904";
    return !isBeforeFirstCommit(branches) && branches.getRevision("HEAD^{tree}") != emptyTree;
}

/// The states of all files; nothing if they cannot be known.
std::optional<vclink::FileStateMap> readStates(vclink::CMAdapter &adapter)
{
    const bool hasFiles = hasFilesInHead(*vclink::git::BranchManager::create(adapter));
    vclink::FileStateMap states = adapter.getFolderStates(adapter.getRootFolder());
    if (states.empty() && hasFiles)
        return std::nullopt;
    return states;
}
