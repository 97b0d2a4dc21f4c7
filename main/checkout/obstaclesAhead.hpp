// SPDX-License-Identifier: MIT
#pragma once

#include "main/checkout/Obstacle.hpp"
#include "main/checkout/WorkingCopy.hpp"
#include "main/checkout/treeChanges.hpp"

/// The rules that run before a checkout begins, for what libgit2 does not report, or reports too
/// late to be refused.
namespace vclink::git
{

// Before a switch or a fast-forward: `before` is an entry of HEAD's tree, `after` of the target's.

/// Finds something above the path that is not a folder, or a folder in the place of a file.
Finding findBlockedWay(WorkingCopy &copy, const TreeChange &change);
/// Finds a FIFO, a socket or a device at the path.
Finding findSpecialFile(WorkingCopy &copy, const TreeChange &change);
/// Finds an ignored link in the place of a new file: libgit2 would write to its target.
Finding findIgnoredLink(WorkingCopy &copy, const TreeChange &change);
/// Finds something that HEAD does not have in a folder that becomes a file: libgit2 would delete
/// the folder's tracked files and then fail.
Finding findForeignInFolder(WorkingCopy &copy, const TreeChange &change);
/// Finds a missing folder that becomes a file or a submodule: libgit2 would write neither that nor
/// its entry.
Finding findMissingFolder(WorkingCopy &copy, const TreeChange &change);
/// Finds a missing file that becomes a symbolic link, or a missing link that becomes a file:
/// libgit2 would write neither that nor its entry.
Finding findMissingFileOfOtherKind(WorkingCopy &copy, const TreeChange &change);
/// Finds a submodule with files that becomes a file.
Finding findSubmodule(WorkingCopy &copy, const TreeChange &change);
/// Finds a staged commit of a submodule that neither side has, or its staged removal: libgit2 would
/// discard either.
Finding findStagedSubmodule(WorkingCopy &copy, const TreeChange &change);
/// Finds a folder with files in the place of a file that becomes a submodule: libgit2 would delete
/// it.
Finding findFolderOfOtherUse(WorkingCopy &copy, const TreeChange &change);
/// Finds something staged in a folder that becomes a submodule: the index cannot have both.
Finding findStagedBelowSubmodule(WorkingCopy &copy, const TreeChange &change);
/// Finds the staged deletion of a file that the target has, or that is still there: libgit2 would
/// track the file again, or delete it.
Finding findStagedDeletion(WorkingCopy &copy, const TreeChange &change);
/// Finds staged content that neither side nor the file has: libgit2 compares only the file, and
/// discards the entry.
Finding findStagedContent(WorkingCopy &copy, const TreeChange &change);

/// Finds what libgit2 would overwrite because it takes it for ignored, in the place of a new file.
Finding findFalselyIgnored(WorkingCopy &copy, const TreeChange &change);

// Before both.

/// Finds something other than a folder in the place of a new submodule, ignored or not: libgit2
/// would fail in the middle of its writing, or use a link as the folder.
Finding findFileForSubmodule(WorkingCopy &copy, const TreeChange &change);

/// Finds a folder with files in the place of a deleted file: libgit2 deletes the folder if the
/// working tree has a name that it sorts between the two, e.g. "file-1" for "file".
Finding findFolderForDeletedFile(WorkingCopy &copy, const TreeChange &change);

/// Finds a folder in which the process may not create or remove files, if it has to.
Finding findUnwritableFolder(WorkingCopy &copy, const TreeChange &change);

// Before a merge: `before` is an entry of a merge base's tree, `after` of the other side's.

/// As findBlockedWay, but ignored links and files do not count.
Finding findBlockedWayOfMerge(WorkingCopy &copy, const TreeChange &change);
/// Finds something untracked in the place of a file of the other side, unless it is ignored or an
/// empty folder. If we have deleted the file and the other side has changed it, a folder is always
/// in the way, and so is an ignored file with further names or that cannot be written to.
Finding findUntracked(WorkingCopy &copy, const TreeChange &change);
/// Finds the folder of a submodule that the other side has removed or replaced, that both have
/// moved, or that only we have in a place that the other side changed as well, if the working tree
/// has a name that libgit2 sorts between the submodule and its folder: libgit2 would delete the
/// folder, or not see the change.
Finding findSubmoduleAfterSibling(WorkingCopy &copy, const TreeChange &change);
/// Finds a file that the user no longer tracks and the other side has deleted or renamed. libgit2
/// would delete it, because HEAD still has it.
Finding findUntrackedOfHead(WorkingCopy &copy, const TreeChange &change);
/// Finds a folder that cannot be written to around a file that both sides have changed. libgit2
/// removes a file in conflict, and creates it again.
Finding findUnwritableFolderOfConflict(WorkingCopy &copy, const TreeChange &change);
/// Finds a new file of the other side whose name differs from one of ours only in case, if the
/// other side has ours too, and `core.ignorecase` is set. libgit2 keeps only one of them.
/// @param theirs the other side's tree
Finding findOtherCase(WorkingCopy &copy, const TreeChange &change, const git_tree *theirs);
/// Finds what is removed for a new file if libgit2 reports it before it writes: an ignored link in
/// its place, an ignored file that must be created again, an ignored link or file above. For
/// changes to which the other rules of a merge do not object.
Finding findYielding(WorkingCopy &copy, const TreeChange &change);
/// Returns true if neither side has the file any more. If they have renamed it, it is in conflict,
/// and libgit2 writes the file of the new name without reporting it.
bool isDeletedByBoth(WorkingCopy &copy, const TreeChange &change);
/// Returns the first file in conflict, for example of a `git stash pop`: no merge is under way, and
/// libgit2 would leave the conflict out of the index, and delete a file that HEAD does not have.
Finding findUnmerged(const WorkingCopy &copy);
/// Returns the first file with a change that Git hides because the file is marked skip-worktree or
/// assume-unchanged. A merge would undo the change, even if the other side does not touch the file.
Finding findHiddenEdit(WorkingCopy &copy);

/// Returns the obstacle of findHiddenEdit for an entry with a change.
Obstacle hiddenEdit(const git_index_entry &entry);

/// Finds a folder above the name in which files cannot be created and removed.
Finding findUnwritableFolderOf(WorkingCopy &copy, const std::string &name);

} // namespace vclink::git
