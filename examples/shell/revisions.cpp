// SPDX-License-Identifier: MIT
#include "revisions.hpp"

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

} // namespace vclink::shell
