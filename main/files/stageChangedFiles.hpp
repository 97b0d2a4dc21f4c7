// SPDX-License-Identifier: MIT
#pragma once

#include <git2/types.h>

#include "main/files/HeldEntries.hpp"

namespace vclink::git
{

/// Brings modified and deleted files into the index by their paths, in memory: what
/// git_index_update_all does, but without the text comparison that it makes of each of them. That
/// costs more than to hash and write the file, and ends the process where the file is empty now and
/// is converted (libgit2 1.5: git_diff_foreach frees what it has not allocated). Submodules,
/// conflicts and what is neither a file nor a link stay as they are. If a file with attributes has
/// changed, only empty files are brought in: the order in which the others are looked at matters
/// then. git_diff_index_to_workdir, git_index_add_bypath, git_index_remove_bypath.
///
/// If one of them fails, the index is read again: git_index_update_all is to be called in any
/// case, and will report what the failure is.
/// @param held gets the files that look changed and are not, so that they are not hashed again
/// @throws LibGit2Exception if the index cannot be read again
void stageChangedFiles(git_repository *repository, git_index *index, HeldEntries &held);

} // namespace vclink::git
