// SPDX-License-Identifier: MIT
#pragma once

#include <git2/types.h>

#include "main/checkout/Obstacle.hpp"
#include "main/checkout/WorkingCopy.hpp"
#include "main/checkout/treeChanges.hpp"

namespace vclink::git
{

/// A rule of a merge: finds a name that is the name of a file in conflict with ".lock" appended,
/// e.g. "Gemfile.lock". libgit2 uses this name for its temporary file while it writes the conflict,
/// and would fail in the middle of its writing. Does not examine files that only a rename combines.
/// @param theirs the other side's tree, which can add such a name
/// @throws LibGit2Exception
Finding findLockOfConflict(git_repository *repository, WorkingCopy &copy, const TreeChange &change,
                           const git_tree *theirs);

} // namespace vclink::git
