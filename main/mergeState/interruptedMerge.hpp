// SPDX-License-Identifier: MIT
#pragma once

#include <git2/types.h>

namespace vclink::git
{

/// Refuses to conclude a merge that was killed before libgit2 had written its result: MERGE_HEAD
/// stands then, but the index is still ours, and a commit would record the other side as merged
/// without its work. Looks at the library's own marker first, and then, for a merge that another
/// program has made through libgit2, whether the index has anything that only the other side has
/// changed. To be called in the state of a merge, while the index is locked and nothing of it has
/// been refreshed.
/// @param ours, theirs the commits of HEAD and of the only MERGE_HEAD
/// @throws LibGit2Exception with the class GIT_ERROR_MERGE and a text that tells how to go on
void refuseInterruptedMerge(git_repository *repository, const git_commit *ours,
                            const git_commit *theirs);

} // namespace vclink::git
