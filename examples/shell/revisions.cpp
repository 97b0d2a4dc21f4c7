// SPDX-License-Identifier: MIT
#include "revisions.hpp"

#include <algorithm>
#include <vector>

#include "vclink/git/LibGit2Exception.hpp"

namespace vclink::shell
{

std::optional<std::string> findRevision(const git::BranchManager &manager,
                                        const std::string &revision)
{
    try
    {
        return manager.getRevision(revision);
    }
    catch (const git::LibGit2Exception &)
    {
        return std::nullopt;
    }
}

bool isBranch(const git::BranchManager &manager, const std::string &name)
{
    const std::vector<git::BranchPointer> branches = manager.getLocalBranches();
    return std::find(branches.begin(), branches.end(), git::BranchPointer("refs/heads/" + name)) !=
           branches.end();
}

} // namespace vclink::shell
