// SPDX-License-Identifier: MIT
#include "main/remote/fetchObstacles.hpp"

#include <algorithm>
#include <iterator>
#include <optional>
#include <string>
#include <vector>

#include <git2/errors.h>
#include <git2/object.h>

#include "error/errorUtil/GitResult.hpp"
#include "error/errorUtil/libgit2Release.hpp"
#include "error/errorUtil/raiseGitError.hpp"
#include "main/remote/Refspec.hpp"
#include "main/remote/fetchMoves.hpp"
#include "main/remote/lookAhead.hpp"
#include "main/remote/remotePath.hpp"
#include "util/path/PathspecArray.hpp"
#include "util/repository/objectIds.hpp"

namespace vclink::git
{
namespace
{

/// The transport for repositories on this machine does not know where the history of a shallow
/// repository ends, and the download writes that down: .git/shallow is gone after it. The releases
/// before 1.9 lose it with each transport.
constexpr bool losesEndOfHistory = isLibGit2Since(1, 7);
constexpr bool losesItOverNetwork = !isLibGit2Since(1, 9);

void refuseLossOfShallow(const git_remote *remote)
{
    const char *const address = git_remote_url(remote);
    if (losesItOverNetwork || (address != nullptr && findRemotePath(address)))
    {
        raiseGitError(GIT_ERROR, GIT_ERROR_REPOSITORY,
                      "this repository lacks the older part of its history, and libgit2 would "
                      "remove the note of where it begins: use 'git fetch'");
    }
}

/// libgit2 since 1.9 accepts them, and leaves what they exclude out of the download only: it still
/// moves and prunes the targets that other refspecs have for it. Earlier releases accept none.
void refuseNegative(const std::vector<Refspec> &refspecs)
{
    const auto negative = std::find_if(refspecs.begin(), refspecs.end(),
                                       [](const Refspec &refspec) { return refspec.isNegative(); });
    if (negative != refspecs.end())
    {
        raiseGitError(GIT_ERROR, GIT_ERROR_INVALID,
                      "libgit2 would not leave out what the refspec '" + negative->source +
                          "' excludes: use 'git fetch'");
    }
}

bool isPruned(const git_remote *remote, const git_fetch_options &options)
{
    return options.prune == GIT_FETCH_PRUNE ||
           (options.prune == GIT_FETCH_PRUNE_UNSPECIFIED && git_remote_prune_refs(remote) != 0);
}

/// Finds the refspecs without "*" whose targets would be deleted if the remote lacked the sources.
/// libgit2 passes over such a source, and git fails.
std::vector<Refspec> findPrunable(git_repository *repository, const git_remote *remote,
                                  const std::vector<Refspec> &refspecs,
                                  const git_fetch_options &options)
{
    std::vector<Refspec> prunable;
    std::copy_if(refspecs.begin(), refspecs.end(), std::back_inserter(prunable),
                 [](const Refspec &refspec)
                 {
                     return !refspec.target.empty() && !refspec.isPattern() &&
                            !isIn(trackingFolder, refspec.target);
                 });
    if (!prunable.empty() && !isPruned(remote, options))
    {
        return {};
    }
    const auto isMissing = [repository](const Refspec &refspec)
    { return !findId(repository, refspec.target); };
    prunable.erase(std::remove_if(prunable.begin(), prunable.end(), isMissing), prunable.end());
    return prunable;
}

void refusePruning(std::vector<Refspec> prunable, const AdvertisedIds &ids)
{
    completeSources(prunable, ids);
    for (const Refspec &refspec : prunable)
    {
        if (ids.count(refspec.source) == 0)
        {
            raiseGitError(GIT_ENOTFOUND, GIT_ERROR_REFERENCE,
                          "the remote has no reference '" + refspec.source +
                              "', and pruning would delete '" + refspec.target +
                              "' here: fetch without this refspec, or turn off fetch.prune and "
                              "remote.NAME.prune");
        }
    }
}

[[noreturn]] void raiseOtherTag(const std::string &name)
{
    raiseGitError(GIT_EEXISTS, GIT_ERROR_REFERENCE,
                  "'" + name +
                      "' is another tag at the remote, which would replace yours: delete or rename "
                      "yours, or use 'git fetch --force'");
}

/// Refuses tags that would be replaced.
/// @return the other references that would be moved
std::vector<Move> refuseTags(git_repository *repository, const std::vector<Move> &moves)
{
    std::vector<Move> others;
    for (const Move &move : moves)
    {
        const auto here = findId(repository, move.target);
        if (!here || isSameId(*here, move.id))
        {
            continue;
        }
        if (isIn(tagsFolder, move.target))
        {
            raiseOtherTag(move.target);
        }
        others.push_back(move);
    }
    return others;
}

/// Returns the commit of an object, for example of an annotated tag.
std::optional<git_oid> findCommit(git_repository *repository, const git_oid &id)
{
    const OwnedHandle<git_object> object =
        acquire<git_object>(git_object_lookup, repository, &id, GIT_OBJECT_ANY).value();
    const auto commit = acquire<git_object>(git_object_peel, object.get(), GIT_OBJECT_COMMIT);
    const int code = commit.has_error() ? commit.error().getCode() : 0;
    if (code == GIT_EINVALIDSPEC || code == GIT_EPEEL)
    {
        return std::nullopt;
    }
    return *git_object_id(commit.value().get());
}

/// Only a branch is always at a commit. As git, compares nothing else.
bool losesCommits(git_repository *repository, const Move &move, const git_oid &here)
{
    if (isIn(branchesFolder, move.target))
    {
        return !descendsFrom(repository, move.id, here);
    }
    const auto before = findCommit(repository, here);
    const auto after = findCommit(repository, move.id);
    return before && after && !descendsFrom(repository, *after, *before);
}

/// @param moves of references that are no tags, whose new commits are here
void refuseLostCommits(git_repository *repository, const std::vector<Move> &moves)
{
    for (const Move &move : moves)
    {
        const auto here = findId(repository, move.target);
        if (here && losesCommits(repository, move, *here))
        {
            raiseGitError(GIT_ENONFASTFORWARD, GIT_ERROR_REFERENCE,
                          "'" + move.target +
                              "' has commits that the remote does not have: fetch into "
                              "refs/remotes/ and merge, or begin the refspec with '+' to discard "
                              "them");
        }
    }
}

} // namespace

void refuseFetchThatLoses(git_repository *repository, git_remote *remote,
                          const PathspecArray &refspecs, const git_fetch_options &options)
{
    const FetchSettings settings = readFetchSettings(repository, remote, refspecs.array(), options);
    refuseNegative(settings.active);
    if (losesEndOfHistory && settings.isShallow)
    {
        refuseLossOfShallow(remote);
    }
    const std::vector<Refspec> prunable =
        findPrunable(repository, remote, settings.active, options);
    const bool mayMove = mayMoveUnguarded(settings);
    if (prunable.empty() && !mayMove)
    {
        return;
    }
    const AdvertisedIds ids =
        lookAtRemote(remote, GIT_DIRECTION_FETCH, options.callbacks, options.proxy_opts);
    refusePruning(prunable, ids);
    if (!mayMove)
    {
        return;
    }
    const std::vector<Move> others = refuseTags(repository, findUnguardedMoves(settings, ids));
    if (!others.empty())
    {
        check(git_remote_download, remote, getArrayPointer(refspecs), &options);
        refuseLostCommits(repository, others);
    }
}

} // namespace vclink::git
