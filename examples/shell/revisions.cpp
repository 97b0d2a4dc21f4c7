// SPDX-License-Identifier: MIT
#include "revisions.hpp"

#include <deque>
#include <set>

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

bool isInHistory(const git::BranchManager &manager, const std::string &id, std::size_t limit)
{
    std::set<std::string> seen;
    std::deque<std::string> pending;
    const auto meet = [&](const std::optional<std::string> &commit)
    {
        if (commit && seen.insert(*commit).second)
        {
            pending.push_back(*commit);
        }
        return commit.has_value();
    };
    meet(findRevision(manager, "HEAD"));
    while (!pending.empty() && seen.count(id) == 0 && seen.size() < limit)
    {
        const std::string commit = pending.front();
        pending.pop_front();
        for (int parent = 1; meet(findRevision(manager, commit + '^' + std::to_string(parent)));)
        {
            ++parent;
        }
    }
    return seen.count(id) != 0;
}

} // namespace vclink::shell
