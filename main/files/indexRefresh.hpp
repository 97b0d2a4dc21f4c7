// SPDX-License-Identifier: MIT
#pragma once

#include <git2/types.h>

namespace vclink::git
{

/// Updates every tracked entry of the index from the working tree, in memory only: stages modified
/// files and removes deleted ones. Keeps entries of files that are not checked out, which
/// git_index_update_all would remove, as it would those of unreadable files. git_index_update_all.
/// @throws LibGit2Exception if the refresh fails or a file cannot be read; then the index must not
/// be written
void refreshIndex(git_repository *repository, git_index *index);

} // namespace vclink::git
