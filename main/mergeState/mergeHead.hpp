// SPDX-License-Identifier: MIT
#pragma once

#include <vector>

#include <git2/types.h>

#include "main/mergeState/MergeSides.hpp"

/// A `git commit` that began before a merge removes MERGE_HEAD at its end, even that of another
/// process.
namespace vclink::git
{

/// Writes MERGE_HEAD again if it is missing: otherwise a commit would contain the other side's work
/// without its history. The index must be locked and must have the merge.
/// @throws LibGit2Exception if this fails
void restoreMergeHead(git_repository *repository, const git_oid &theirs);

/// Refuses a commit that would remove MERGE_HEAD without having its parents: `git rebase` can stop
/// at a merge, and libgit2 reports only the rebase then.
/// @param state what readRepositoryState() has returned
/// @throws LibGit2Exception
void refuseCommitWithoutMergeHead(git_repository *repository, int state);

/// Refuses a commit that would lack parents because MERGE_HEAD has NUL bytes, for example after a
/// power failure: libgit2 reads up to the first one, and reports no error.
/// @throws LibGit2Exception also if the file cannot be read
void refuseDamagedMergeHead(git_repository *repository);

/// Refuses a commit that would not belong to this merge, because another process has moved HEAD,
/// committed the merge or aborted it.
/// @param parents the parents of the commit
/// @throws LibGit2Exception with the code GIT_EMODIFIED and the class GIT_ERROR_MERGE
void refuseOtherParents(const MergeSides &merge, const std::vector<const git_commit *> &parents);

} // namespace vclink::git
