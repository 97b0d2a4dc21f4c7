// SPDX-License-Identifier: MIT
#pragma once

#include <git2/types.h>

namespace vclink::git
{

/// Brings every tracked entry of the index up to the working tree, in memory only: modified files
/// are staged, deleted ones dropped. git_index_update_all, which would also drop entries whose file
/// is not gone but only not checked out or not readable: the former stay as they were.
/// @throws LibGit2Exception when the refresh fails, or when a file can't be read; the index is not
/// to be written then
void refreshIndex(git_repository *repository, git_index *index);

} // namespace vclink::git
