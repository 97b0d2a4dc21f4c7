// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include <git2/oid.h>
#include <git2/types.h>

#include "error/errorUtil/GitResult.hpp"
#include "fl/filesystem/path.hpp"

/// Each helper wraps one libgit2 getter and hands out a handle that the caller owns. A handle
/// belongs to one operation and one thread. Those that raise throw what GitErrorPolicy throws.
namespace vclink::git
{

/// Whether `path` itself is a repository: no search upwards, and nothing stays open.
/// git_repository_open_ext.
/// @throws LibGit2Exception when that can't be found out, a missing folder not counting
bool isRepository(const upath &path);

/// Opens the repository of exactly this folder. git_repository_open_ext. Raises.
[[nodiscard]] OwnedHandle<git_repository> openRepository(const upath &root);

/// What is under way, a number of git_repository_state_t. git_repository_state, and once more where
/// it says that nothing is and MERGE_HEAD stands. Raises when that can't be looked at.
int readRepositoryState(git_repository *repository);

/// git_repository_state_cleanup, and once more where MERGE_HEAD stands after it. Raises.
void cleanUpRepositoryState(git_repository *repository);

/// git_repository_index, and for an empty index git_index_read, to be sure. Raises.
[[nodiscard]] OwnedHandle<git_index> getRepositoryIndex(git_repository *repository);

/// git_index_open, and for an empty index git_index_read, to be sure: what this file holds,
/// whatever the repository's index has come to in memory. Raises.
[[nodiscard]] OwnedHandle<git_index> openIndex(const char *path);

/// git_index_write. Raises; the index on disk is as it was then.
void writeIndex(git_index *index);

/// The id of the tree made of the index. git_index_write_tree. Raises.
git_oid writeIndexTree(git_index *index);

/// git_tree_lookup. Raises.
[[nodiscard]] OwnedHandle<git_tree> lookupTree(git_repository *repository, const git_oid *id);

/// The object that a revision text names. git_revparse_single. Keeps a failure.
GitResult<OwnedHandle<git_object>> revparseObject(git_repository *repository,
                                                  const std::string &spec);

/// The id of the object that a revision text names. git_revparse_single, git_object_id. Raises.
/// @return the calling thread's copy, good until the next call on the thread
const git_oid *revparseId(const std::string &spec, git_repository *repository);

/// The id of HEAD's commit. git_reference_name_to_id. Raises.
git_oid readHeadId(git_repository *repository);

/// The commit of a reference, by any name that git_reference_dwim takes. git_reference_dwim,
/// git_reference_target, git_commit_lookup. Keeps a failure.
GitResult<OwnedHandle<git_commit>> lookupCommitByName(const char *name, git_repository *repository);

} // namespace vclink::git
