// SPDX-License-Identifier: MIT
#pragma once

#include <git2/remote.h>
#include <git2/types.h>

#include "util/path/PathspecArray.hpp"

namespace vclink::git
{

/// Refuses a fetch that would lose a reference or its commits, where git refuses and libgit2 does
/// not:
///
/// - Pruning would delete the target of a refspec without "*", because the remote lacks the source.
/// - A tag would be replaced without a '+'.
/// - A branch, or another reference outside refs/remotes/, such as one to notes, would lose commits
///   without a '+', because libgit2 cannot compare them or does not.
/// - The repository is shallow, and the download would remove .git/shallow: then git reports the
///   repository as broken, and libgit2 takes commits from branches.
/// - A refspec is negative (`^refs/heads/x`), and libgit2 would move or prune what git leaves.
///
/// Asks the remote only if refspecs and settings allow one of these; the fetch on the same handle
/// then uses the connection. Downloads the commits of such a reference to compare them.
/// git_remote_connect, git_remote_ls, git_remote_download.
/// @param refspecs what the fetch is given
/// @throws LibGit2Exception that names the reference, or if a call fails
void refuseFetchThatLoses(git_repository *repository, git_remote *remote,
                          const PathspecArray &refspecs, const git_fetch_options &options);

} // namespace vclink::git
