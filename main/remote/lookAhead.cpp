// SPDX-License-Identifier: MIT
#include "main/remote/lookAhead.hpp"

#include <algorithm>
#include <cstddef>
#include <iterator>
#include <set>
#include <utility>

#include <git2/commit.h>
#include <git2/errors.h>
#include <git2/refs.h>

#include "error/errorUtil/GitResult.hpp"
#include "util/repository/objectIds.hpp"

namespace vclink::git
{
namespace
{

struct LessId
{
    bool operator()(const git_oid &left, const git_oid &right) const noexcept
    {
        return std::lexicographical_compare(std::begin(left.id), std::end(left.id),
                                            std::begin(right.id), std::end(right.id));
    }
};

} // namespace

AdvertisedIds lookAtRemote(git_remote *remote, git_direction direction,
                           const git_remote_callbacks &callbacks, const git_proxy_options &proxy)
{
    check(git_remote_connect, remote, direction, &callbacks, &proxy, nullptr);
    const git_remote_head **heads = nullptr;
    std::size_t count = 0;
    check(git_remote_ls, &heads, &count, remote);
    AdvertisedIds ids;
    std::for_each(heads, heads + count,
                  [&ids](const git_remote_head *head) { ids.emplace(head->name, head->oid); });
    return ids;
}

void completeSources(std::vector<Refspec> &refspecs, const AdvertisedIds &ids)
{
    for (Refspec &refspec : refspecs)
    {
        const std::string name = refspec.source;
        for (const char *const folder : {"refs/", "refs/tags/", "refs/heads/"})
        {
            if (!isIn("refs/", name) && ids.count(folder + name) != 0)
            {
                refspec.source = folder + name;
            }
        }
    }
}

std::optional<git_oid> findId(git_repository *repository, const std::string &reference)
{
    git_oid id{};
    const GitResult<void> found =
        call(git_reference_name_to_id, &id, repository, reference.c_str());
    const int code = found.has_error() ? found.error().getCode() : 0;
    // libgit2 refuses an impossible name where it would write it.
    if (code == GIT_ENOTFOUND || code == GIT_EINVALIDSPEC)
    {
        return std::nullopt;
    }
    check(found);
    return id;
}

bool descendsFrom(git_repository *repository, const git_oid &commit, const git_oid &ancestor)
{
    std::set<git_oid, LessId> seen{commit};
    std::vector<git_oid> pending{commit};
    while (!pending.empty())
    {
        const git_oid id = pending.back();
        pending.pop_back();
        if (isSameId(id, ancestor))
        {
            return true;
        }
        auto found = acquire<git_commit>(git_commit_lookup, repository, &id);
        if (found.has_error() && found.error().getCode() == GIT_ENOTFOUND)
        {
            continue;
        }
        const OwnedHandle<git_commit> next = std::move(found).value();
        const unsigned parents = git_commit_parentcount(next.get());
        for (unsigned place = 0; place < parents; ++place)
        {
            const git_oid &parent = *git_commit_parent_id(next.get(), place);
            if (seen.insert(parent).second)
            {
                pending.push_back(parent);
            }
        }
    }
    return false;
}

} // namespace vclink::git
