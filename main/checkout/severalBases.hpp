// SPDX-License-Identifier: MIT
#pragma once

#include <vector>

#include <git2/types.h>

#include "error/errorUtil/OwnedHandle.hpp"
#include "main/checkout/Obstacle.hpp"
#include "main/checkout/WorkingCopy.hpp"

namespace vclink::git
{

/// Compares both sides of a merge with several merge bases. libgit2 first merges the bases,
/// possibly with conflicts, so that no base alone shows what conflicts then. Finds a file that
/// differs if its name with `.lock` appended is taken, and a link of one side that is a folder of
/// the other, unless all bases have the file or link as one of the sides.
/// @param theirs the other side's tree
/// @throws LibGit2Exception
Finding findBetweenSides(git_repository *repository, WorkingCopy &copy,
                         const std::vector<OwnedHandle<git_tree>> &bases, const git_tree *theirs);

} // namespace vclink::git
