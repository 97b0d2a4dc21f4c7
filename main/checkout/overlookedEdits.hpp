// SPDX-License-Identifier: MIT
#pragma once

#include "main/checkout/Obstacle.hpp"
#include "main/checkout/WorkingCopy.hpp"
#include "main/checkout/treeChanges.hpp"
#include "util/repository/ChangedFiles.hpp"

/// The rules for changes of the user that libgit2 would overwrite, or a merge commit, because
/// libgit2 takes the file for unchanged or ignored.
namespace vclink::git
{

/// Finds a tracked file with a change that libgit2 does not see: it compares only the size and the
/// time of the last change. git also compares the inode and the time at which that changed. libgit2
/// takes a file for unchanged if it cannot read it or compute its id: the size of one of more than
/// 4 GiB does not fit, and one may grow at that moment. So every change is looked for here. If the
/// size differs, libgit2 compares the content after the conversion of line ends, and git takes the
/// file for changed. Also finds a folder in the place of a tracked file, if the name is ignored:
/// libgit2 would delete the folder.
Finding findOverlookedEdit(WorkingCopy &copy, const TreeChange &change);

/// Returns the first tracked file with a change, before a merge. libgit2 sees most of these, after
/// it has run the merge's commands. It overlooks a change for the reasons that findOverlookedEdit
/// has, and the merge's commit would contain the change of a file that the merge does not touch.
Finding findEditBeforeMerge(WorkingCopy &copy, const ChangedFiles &changed);

/// Finds a file that is in the index although it is ignored, in the place of a new file or folder.
Finding findStagedThoughIgnored(WorkingCopy &copy, const TreeChange &change);

} // namespace vclink::git
