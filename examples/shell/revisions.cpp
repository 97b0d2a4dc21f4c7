// SPDX-License-Identifier: MIT
#include "revisions.hpp"

#include <algorithm>
#include <vector>

#include "vclink/git/LibGit2Exception.hpp"

namespace vclink::shell
{
namespace
{

bool isBeforeFirstCommit(const git::BranchManager &manager)
{
    constexpr int isUnborn = -9; // GIT_EUNBORNBRANCH
    try
    {
        manager.getCurrentBranch();
        return false;
    }
    catch (const git::LibGit2Exception &failure)
    {
        return failure.getError().getCode() == isUnborn;
    }
}

bool has(const std::vector<git::BranchPointer> &branches, const std::string &reference)
{
    return std::find(branches.begin(), branches.end(), git::BranchPointer(reference)) !=
           branches.end();
}

} // namespace

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
    return has(manager.getLocalBranches(), "refs/heads/" + name);
}

bool isUnreadable(const git::BranchManager &manager, const std::string &name)
{
    if (name == "HEAD")
    {
        // Throws if the repository can't be opened.
        manager.getRepositoryState();
        return !isBeforeFirstCommit(manager);
    }
    return isBranch(manager, name) || has(manager.getRemoteBranches(), "refs/remotes/" + name);
}

bool isHeadUnreadable(const git::BranchManager &manager)
{
    return !findRevision(manager, "HEAD^{tree}") && isUnreadable(manager, "HEAD");
}

} // namespace vclink::shell
