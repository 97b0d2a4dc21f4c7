// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include <git2/oid.h>
#include <git2/types.h>

#include "error/errorUtil/GitResult.hpp"
#include "fl/filesystem/path.hpp"

/// Each function wraps one libgit2 getter and returns a handle that the caller owns. A handle
/// belongs to one operation and one thread. The functions throw what GitErrorPolicy throws, except
/// those that return a GitResult.
namespace vclink::git
{

/// Returns true if `path` itself is a repository, without searching upwards. Keeps nothing open.
/// git_repository_open_ext.
/// @throws LibGit2Exception if this cannot be found out; a missing folder is not a repository
bool isRepository(const upath &path);

/// Opens the repository of exactly this folder, which is then its working tree, also if a linked
/// working tree was moved or copied. git_repository_open_ext, git_repository_set_workdir.
/// @throws LibGit2Exception also if the working tree is another folder (core.worktree)
[[nodiscard]] OwnedHandle<git_repository> openRepository(const upath &root);

/// The same for operations that look for untracked or ignored files. Also calls
/// refuseFatalPatterns().
[[nodiscard]] OwnedHandle<git_repository> openWorkingCopy(const upath &root);

/// Returns the operation under way, a git_repository_state_t, or a negative number if libgit2
/// cannot find it. git_repository_state, and again if it reports none and MERGE_HEAD exists. Throws
/// if MERGE_HEAD cannot be examined.
int findRepositoryState(git_repository *repository);

/// Returns what findRepositoryState() does. Throws if that is negative.
int readRepositoryState(git_repository *repository);

/// Returns true if MERGE_HEAD exists. libgit2 reports a merge only if no rebase is under way.
/// Throws if it cannot be examined.
bool hasMergeHead(git_repository *repository);

/// Returns true if git has commits left to cherry-pick or revert. Between two of them, for example
/// after the user has committed one that was in conflict, git_repository_state reports that nothing
/// is under way. Throws if this cannot be found out.
bool isInSeries(git_repository *repository);

/// Ends what a commit concludes. git_repository_state_cleanup, and again if MERGE_HEAD still
/// exists; as git does, keeps the rest of a series that the commit is not part of, and a bisection
/// if it concludes something else. Also removes the list of conflicts for `git rerere` and the
/// message of a squash.
void cleanUpRepositoryState(git_repository *repository);

/// Returns true if the repository lacks the older part of its history. git_repository_is_shallow
/// does not see it in a linked working tree. Throws if the list of the oldest commits cannot be
/// examined.
bool isShallow(git_repository *repository);

/// Returns the repository's index. git_repository_index, and for an empty index git_index_read, to
/// be sure.
[[nodiscard]] OwnedHandle<git_index> getRepositoryIndex(git_repository *repository);

/// Returns the content of the index file, whatever the repository's index has in memory.
/// git_index_open, and for an empty index git_index_read, to be sure.
[[nodiscard]] OwnedHandle<git_index> openIndex(const char *path);

/// Writes the index. After a failure the index on disk is unchanged. git_index_write.
void writeIndex(git_index *index);

/// Writes a tree of the index and returns its id. git_index_write_tree.
git_oid writeIndexTree(git_index *index);

/// Returns a tree. git_tree_lookup.
[[nodiscard]] OwnedHandle<git_tree> lookupTree(git_repository *repository, const git_oid *id);

/// Returns the object that a revision text names, or the failure. git_revparse_single.
GitResult<OwnedHandle<git_object>> revparseObject(git_repository *repository,
                                                  const std::string &spec);

/// Returns the id of the object that a revision text names. git_revparse_single, git_object_id.
/// @return the calling thread's copy, valid until the next call on the thread
const git_oid *revparseId(const std::string &spec, git_repository *repository);

/// Returns the id of HEAD's commit. git_reference_name_to_id.
git_oid readHeadId(git_repository *repository);

/// Returns the commit of a reference, or the failure, for any name that git_reference_dwim accepts.
/// git_reference_dwim, git_reference_target, git_commit_lookup.
GitResult<OwnedHandle<git_commit>> lookupCommitByName(const char *name, git_repository *repository);

} // namespace vclink::git
