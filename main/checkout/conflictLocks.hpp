// SPDX-License-Identifier: MIT
#pragma once

#include <git2/types.h>

#include "main/checkout/Obstacle.hpp"
#include "main/checkout/WorkingCopy.hpp"
#include "main/checkout/treeChanges.hpp"

namespace vclink::git
{

/// A rule of a merge: something whose name is that of a file in conflict with ".lock" behind it,
/// e.g. "Gemfile.lock". While libgit2 writes the conflict this is the name of its own temporary
/// file, and it would give up in the midst of its writing. Files that only a rename brings together
/// are not looked at.
/// @param theirs the other side's tree, where such a name may come from
/// @throws LibGit2Exception
Finding findLockOfConflict(git_repository *repository, WorkingCopy &copy, const TreeChange &change,
                           const git_tree *theirs);

} // namespace vclink::git
