// SPDX-License-Identifier: MIT
#include <optional>
#include <string>

#include "vclink/CMAdapter.hpp"
#include "vclink/FileStateMap.hpp"
#include "vclink/git/BranchManager.hpp"
#include "vclink/git/LibGit2Exception.hpp"

bool hasFilesInHead(const vclink::git::BranchManager &branches)
{
    const std::string emptyTree = "4b825dc642cb6eb9a060e54bf8d69288fbee4904";
    try
    {
        return branches.getRevision("HEAD^{tree}") != emptyTree;
    }
    catch (const vclink::git::LibGit2Exception &)
    {
        return false; // there is no commit yet
    }
}

/// The states of all files; nothing if they cannot be known.
std::optional<vclink::FileStateMap> readStates(vclink::CMAdapter &adapter)
{
    vclink::FileStateMap states = adapter.getFolderStates(adapter.getRootFolder());
    if (states.empty() && hasFilesInHead(*vclink::git::BranchManager::create(adapter)))
        return std::nullopt;
    return states;
}
