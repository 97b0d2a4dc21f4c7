// SPDX-License-Identifier: MIT
#pragma once

#include <vector>

#include <git2/types.h>

#include "util/repository/ChangedFiles.hpp"

namespace vclink::git
{

/// Gives staged files with the attribute `ident` the content that git would store, in memory: git
/// replaces each `$Id: ...$` in a line by `$Id$`. libgit2 replaces only the first one, also across
/// lines, and takes any word that begins with `$Id` for one: from `$Idle = $x` it would store
/// `$Id$x`. Call after git_index_update_all or git_index_add_all, before the index is written.
/// Reads what libgit2 has staged once more, and asks for attributes only if it contains `$Id`.
///
/// libgit2's checkout replaces the same words by the id of the content: it makes `$Id: ... $x` of
/// `$Idle = $x`. Restores them from that content, except after an edit above them in a file that
/// also has real ids. git_attr_get, git_filter_list_load, git_filter_list_apply_to_buffer,
/// git_odb_read, git_blob_create_from_buffer, git_index_add.
///
/// Leaves files with a filter of `filter.*` to libgit2.
/// @param changed files that libgit2 may have taken for unmodified
/// @throws LibGit2Exception, also if a file cannot be read; then the index must not be written
void stageIdentifiedFiles(git_repository *repository, git_index *index,
                          const std::vector<ChangedFile> &changed);

} // namespace vclink::git
