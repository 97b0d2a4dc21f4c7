// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

#include <git2/types.h>

#include "main/files/HeldEntries.hpp"
#include "util/repository/ChangedFiles.hpp"

namespace vclink::git
{

/// Updates every tracked entry of the index from the working tree, in memory only: stages modified
/// files and removes deleted ones. Keeps entries of files that are not checked out, which
/// git_index_update_all would remove, as it would those of unreadable files. git_index_update_all.
/// @param changed what stageChangedFiles() was given; it is read again for what that left
/// @param removed what stageChangedFiles() has removed
/// @param held entries that need no comparison; they are given back
/// @throws LibGit2Exception if the refresh fails, a file cannot be read, or a removed one exists
/// again; then the index must not be written
void refreshIndex(git_repository *repository, git_index *index, const ChangedFiles &changed,
                  const std::vector<std::string> &removed, HeldEntries &held);

/// Marks in the index, in memory, the files that were saved since the refresh in the second in
/// which the index was written. git, which ignores fractions, would treat them as unchanged. For an
/// index that is locked with IndexTime::Fraction; to be called right before it is written.
/// @throws LibGit2Exception
void markSavedSince(git_repository *repository, git_index *index);

} // namespace vclink::git
