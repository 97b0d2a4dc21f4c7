// SPDX-License-Identifier: MIT
#pragma once

#include "main/checkout/Obstacle.hpp"
#include "main/checkout/WorkingCopy.hpp"
#include "main/checkout/treeChanges.hpp"

/// The rules that look before a checkout begins: at what libgit2 does not tell of, or tells too
/// late to be refused.
namespace vclink::git
{

// Before a switch or a fast-forward: `before` is of HEAD's tree, `after` of the target's.

/// Something above the path that is no folder, or a folder in the place of a file.
Finding findBlockedWay(WorkingCopy &copy, const TreeChange &change);
/// A FIFO, a socket or a device at the path.
Finding findSpecialFile(WorkingCopy &copy, const TreeChange &change);
/// An ignored link where a file comes: libgit2 would write to what it leads to.
Finding findIgnoredLink(WorkingCopy &copy, const TreeChange &change);
/// Something that HEAD does not have in a folder that becomes a file: libgit2 would delete the
/// folder's tracked files and then fail.
Finding findForeignInFolder(WorkingCopy &copy, const TreeChange &change);
/// A missing folder that becomes a file or a submodule: libgit2 would write neither that nor its
/// entry.
Finding findMissingFolder(WorkingCopy &copy, const TreeChange &change);
/// A submodule with files that becomes a file.
Finding findSubmodule(WorkingCopy &copy, const TreeChange &change);
/// The staged commit of a submodule that is neither side's, or its staged removal: libgit2 would
/// drop either.
Finding findStagedSubmodule(WorkingCopy &copy, const TreeChange &change);
/// A folder with files in the place of a file that becomes a submodule: libgit2 would delete it.
Finding findFolderOfOtherUse(WorkingCopy &copy, const TreeChange &change);
/// Something staged in a folder that becomes a submodule: the index cannot hold both.
Finding findStagedBelowSubmodule(WorkingCopy &copy, const TreeChange &change);
/// Staged content that is neither side's and not the file's either: libgit2 compares the file only,
/// and drops the entry.
Finding findStagedContent(WorkingCopy &copy, const TreeChange &change);

// Of both.

/// Something other than a folder where a submodule comes, ignored or not: libgit2 would fail in the
/// midst of its writing, or take a link for the folder.
Finding findFileForSubmodule(WorkingCopy &copy, const TreeChange &change);

/// A folder with files in the place of a file that is deleted: libgit2 deletes the folder if the
/// working tree has a name that it sorts between the two, e.g. "file-1" for "file".
Finding findFolderForDeletedFile(WorkingCopy &copy, const TreeChange &change);

// Before a merge: `before` is of a merge base's tree, `after` of the other side's.

/// As findBlockedWay; ignored links and files do not count.
Finding findBlockedWayOfMerge(WorkingCopy &copy, const TreeChange &change);
/// Something untracked where the other side has a file, unless it is ignored or an empty folder. A
/// folder is always in the way if ours has deleted the file and the other side has changed it.
Finding findUntracked(WorkingCopy &copy, const TreeChange &change);
/// The folder of a submodule that the other side has removed or replaced, or that both have moved,
/// if the working tree has a name that libgit2 sorts between the submodule and its folder: it then
/// deletes the folder, or does not see the change.
Finding findSubmoduleAfterSibling(WorkingCopy &copy, const TreeChange &change);
/// What gives way to a new file as long as libgit2 tells of it before it writes: an ignored link in
/// its place, an ignored link or file above. For changes that the other rules of a merge let pass.
Finding findYielding(WorkingCopy &copy, const TreeChange &change);
/// Whether neither side has the file any more. Theirs may have renamed it: then it is in conflict,
/// and libgit2 writes the file of the new name without telling of it.
bool isDeletedByBoth(WorkingCopy &copy, const TreeChange &change);
/// The first file with a change that Git hides, since the file is marked skip-worktree or
/// assume-unchanged. A merge would undo it, whether the other side touches the file or not.
Finding findHiddenEdit(WorkingCopy &copy);

/// What findHiddenEdit says of an entry with a change.
Obstacle hiddenEdit(const git_index_entry &entry);
/// Whether Git hides changes of the entry's file.
bool isHidden(const git_index_entry &entry) noexcept;

} // namespace vclink::git
