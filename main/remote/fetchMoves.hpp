// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

#include <git2/oid.h>
#include <git2/remote.h>
#include <git2/types.h>

#include "main/remote/Refspec.hpp"
#include "main/remote/lookAhead.hpp"

namespace vclink::git
{

/// What decides which references a fetch writes.
struct FetchSettings
{
    std::vector<Refspec> active;
    /// the configured refspecs if others are given: they apply to what these fetch
    std::vector<Refspec> passive;
    git_remote_autotag_option_t tags = GIT_REMOTE_DOWNLOAD_TAGS_AUTO;
    bool isShallow = false;
};

/// @param given the refspecs of the call
FetchSettings readFetchSettings(git_repository *repository, const git_remote *remote,
                                const git_strarray &given, const git_fetch_options &options);

/// A reference that the fetch writes.
struct Move
{
    std::string target;
    git_oid id;
};

/// Returns true if findUnguardedMoves() can find something, whatever the remote has.
bool mayMoveUnguarded(const FetchSettings &settings);

/// Finds the tags that the fetch writes without a '+', and the other references outside
/// refs/remotes/ that it writes without a '+' and for which libgit2 does not find out whether they
/// move forward:
///
/// - in a shallow repository, where it takes missing parents for a yes
/// - if the source is not a branch, because it takes any failure for a yes
/// - if the source is an object id, or a configured refspec applies beside a given one: then it
///   does not compare.
std::vector<Move> findUnguardedMoves(const FetchSettings &settings, const AdvertisedIds &ids);

} // namespace vclink::git
