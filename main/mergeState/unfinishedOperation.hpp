// SPDX-License-Identifier: MIT
#pragma once

#include <git2/types.h>

namespace vclink::git
{

/// Throws if a merge, revert, cherry-pick, rebase or an application of patches is under way. After
/// a switch it would be concluded on the other branch, and count work as merged that is not there,
/// or drop commits. Also throws after `git merge --squash --autostash`. A bisection may go on.
/// @throws LibGit2Exception also if the state cannot be read
void refuseSwitchInUnfinishedOperation(git_repository *repository);

/// Throws if git has put changes of the user aside for the merge, squash or rebase that the commit
/// would conclude, with --autostash. git brings them back when it concludes the operation; after
/// another conclusion only `git fsck` would find them.
/// @throws LibGit2Exception
void refuseCommitWithAutostash(git_repository *repository);

/// Throws if `git am` has patches left after the one that the commit would conclude. The end of the
/// operation deletes them, and they may be nowhere else: git splits a mail into files of its own.
/// @param state what readRepositoryState returned
/// @throws LibGit2Exception also if the files of `git am` cannot be read
void refuseCommitWithPatches(git_repository *repository, int state);

/// Throws if a rebase or bisection returns to the branch or moves it, or if another working tree
/// has it checked out: neither could be continued without it.
/// @param reference the full name of the branch
/// @throws LibGit2Exception
void refuseDeletionInUnfinishedOperation(git_repository *repository, const char *reference);

} // namespace vclink::git
