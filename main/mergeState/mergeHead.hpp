// SPDX-License-Identifier: MIT
#pragma once

#include <vector>

#include <git2/types.h>

#include "main/mergeState/MergeSides.hpp"

/// A `git commit` that began before a merge removes MERGE_HEAD when it is done, whoever wrote it.
namespace vclink::git
{

/// Writes MERGE_HEAD again if it is gone. To be called while the index is locked and has the merge:
/// a commit would record the other side's work without the other side.
/// @throws LibGit2Exception if that fails
void restoreMergeHead(git_repository *repository, const git_oid &theirs);

/// Refuses a commit that would not be of this merge, because another process has moved HEAD,
/// committed the merge or taken it back.
/// @param parents those that the commit would have
/// @throws LibGit2Exception with the code GIT_EMODIFIED and the class GIT_ERROR_MERGE
void refuseOtherParents(const MergeSides &merge, const std::vector<const git_commit *> &parents);

} // namespace vclink::git
