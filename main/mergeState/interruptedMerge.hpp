// SPDX-License-Identifier: MIT
#pragma once

#include <git2/types.h>

namespace vclink::git
{

/// Refuses to conclude a merge that was killed before libgit2 had written its result: MERGE_HEAD
/// exists, but the index is still ours, and a commit would record the other side as merged without
/// its work. Checks the library's own marker first. Then checks, for a merge that another program
/// has made through libgit2, whether the index has anything that only the other side has changed.
/// Call it in the state of a merge, while the index is locked and before it is refreshed.
/// @param ours, theirs the commits of HEAD and of the only MERGE_HEAD
/// @throws LibGit2Exception with the class GIT_ERROR_MERGE and a text that describes how to
/// continue
void refuseInterruptedMerge(git_repository *repository, const git_commit *ours,
                            const git_commit *theirs);

} // namespace vclink::git
