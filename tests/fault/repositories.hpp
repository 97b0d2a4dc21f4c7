// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "support/GitRepository.hpp"

/// What operations run on: each makes a working copy of a new repository.
namespace vclink::test
{

/// "file", "other" and "sub/inside" in one commit on main, and an identity.
void makePlain(GitRepository &repository);
/// Nothing but an identity.
void makeEmpty(GitRepository &repository);
/// Plain, and a file of every state: "file" modified, "other" missing, "staged" added, "new"
/// unversioned.
void makeChanged(GitRepository &repository);
/// Plain, and nothing left in the index.
void makeUnindexed(GitRepository &repository);
/// Changed, without an identity in the configuration.
void makeAnonymous(GitRepository &repository);
/// Plain, and "file" gone from the working tree, "sub/inside" left out of it by a sparse checkout.
void makeSparse(GitRepository &repository);
/// Plain under line-end conversion, "file" and "other" empty now, "new" unversioned.
void makeEmptied(GitRepository &repository);
/// Plain with the attribute `ident` and line-end conversion, and several ids in "file" and "new",
/// which is unversioned.
void makeIdentified(GitRepository &repository);
/// Plain, and a link to itself in the place of "sub", so that "sub/inside" can't be looked at.
void makeUnreadable(GitRepository &repository);
/// Plain, and "file" staged as a link.
void makeTypeChange(GitRepository &repository);
/// Plain with the branch "topic", which changes "file"; the working tree is clean.
void makeBranches(GitRepository &repository);
/// Branches, with settings of "topic", one of them twice.
void makeSettings(GitRepository &repository);
/// Branches, and a linked working tree with a branch of its own, in a bisection.
void makeLinkedTree(GitRepository &repository);
/// A linked working tree that was moved, with "file" modified.
void makeMovedTree(GitRepository &repository);
/// Branches, with an untracked link in the place of "sub", which both branches have.
void makeLinkedFolder(GitRepository &repository);
/// Plain with "folder/deep/inside", and the branch "topic", where "folder" is a file.
void makeReplacedFolder(GitRepository &repository);
/// makeBranches() with a link among the branches that leads nowhere.
void makeBrokenLink(GitRepository &repository);
/// makeBranches(), where contents may be missing. None is.
void makePromising(GitRepository &repository);
/// Branches, with main where "topic" is.
void makeUpToDate(GitRepository &repository);
/// Branches, with another change of other files on main.
void makeDiverged(GitRepository &repository);
/// Diverged, and files that are marked skip-worktree, unchanged; "topic" changes one of them.
void makeHidden(GitRepository &repository);
/// Diverged, and an ignored folder where "topic" adds a file.
void makeIgnored(GitRepository &repository);
/// "topic" changes ".gitattributes" and adds "added".
void makeChangedAttributes(GitRepository &repository);
/// The same, with another change on main.
void makeDivergedAttributes(GitRepository &repository);
/// "topic" has the submodule "come" and lacks "gone", which main has, and changes "file". The
/// folders of both are there.
void makeSubmodules(GitRepository &repository);
/// The same, with another change on main.
void makeDivergedSubmodules(GitRepository &repository);
/// makeMerging(), as if another program had merged through libgit2.
void makeMergingWithoutMark(GitRepository &repository);
/// Stopped in a merge that has moved the submodule "moved".
void makeMergingSubmodule(GitRepository &repository);
/// Diverged, and stopped in a merge without conflicts.
void makeMerging(GitRepository &repository);
/// Main and topic change the same line of "file", for which there is no tool.
void makeConflict(GitRepository &repository);
/// Main and topic change other lines of "file", and "topic" adds "file.lock".
void makeMergedBesideLock(GitRepository &repository);
/// "new" is a folder of ours and a file of theirs.
void makeFileAndFolder(GitRepository &repository);
/// Conflict, "file" being one that must not hold markers.
void makeUnmergeableConflict(GitRepository &repository);
/// Conflict, a configured command merging the file.
void makeConflictForTool(GitRepository &repository);
/// Conflict, and stopped in its merge.
void makeConflicted(GitRepository &repository);
/// Plain with the remote "origin", a bare repository beside it; each of the two has a commit that
/// the other lacks.
void makeRemote(GitRepository &repository);
/// Remote, in a shallow repository that prunes; the branch "copy" is behind the remote's main.
void makeGuardedFetch(GitRepository &repository);
/// Remote with an address for pushes and the tag "v1" of both. The remote has a linked working tree
/// of its branch "kept", which may be pushed to, but must not lose commits.
void makeGuardedPush(GitRepository &repository);
/// Plain with attributes.
void makeAttributes(GitRepository &repository);

} // namespace vclink::test
