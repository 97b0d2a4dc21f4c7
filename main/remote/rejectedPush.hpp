// SPDX-License-Identifier: MIT
#pragma once

#include <vector>

#include <git2/types.h>

#include "main/remote/Refspec.hpp"

namespace vclink::git
{

/// Refuses what git's receiving side rejects, or libgit2 would write in part, if the remote is a
/// repository on this machine that libgit2 writes to itself:
///
/// - trees that the remote does not have under that name, because libgit2 would not write their
///   content
/// - deletions of branches, if receive.denyDeletes is set
/// - branches that would lose commits, if receive.denyNonFastForwards is set
/// - another commit for a branch that a linked working tree has checked out, or its deletion, and
///   the deletion of the current branch, unless receive.denyCurrentBranch or
///   receive.denyDeleteCurrent allow it.
///
/// Opens the remote's repository only if a refspec deletes or begins with '+', or if it may have
/// linked working trees, or would get a tree. git_revparse_single unless a branch is pushed,
/// git_object_peel, git_repository_open_ext, git_config_get_bool, git_config_get_string.
/// @param remote its address is the one that is pushed to
/// @throws LibGit2Exception that names the reference, or if a call fails
void refuseRejectedPush(git_repository *repository, const git_remote *remote,
                        const std::vector<Refspec> &refspecs);

} // namespace vclink::git
