// SPDX-License-Identifier: MIT
#include <string>
#include <vector>

#include "hostTools.hpp"
#include "vclink/CMAdapter.hpp"
#include "vclink/git/BranchManager.hpp"
#include "vclink/git/GitException.hpp"
#include "vclink/git/LibGit2Guard.hpp"

/// The files to resolve; none after a merge without conflicts.
/// @throws vclink::git::GitException if the merge failed otherwise; it was cancelled if the host
/// has asked for that
std::vector<upath> merge(vclink::CMAdapter &adapter, const std::string &branch)
{
    const auto branches = vclink::git::BranchManager::create(adapter);
    const bool wasNormal = branches->getRepositoryState() == "Normal";
    const vclink::git::LibGit2Guard guard;
    try
    {
        branches->merge(branch);
    }
    catch (const vclink::git::GitException &)
    {
        if (!wasNormal || branches->getRepositoryState() != "Conflicts")
            throw;
        return host_tools::filesInConflict(adapter);
    }
    return {};
}
