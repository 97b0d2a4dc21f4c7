// SPDX-License-Identifier: MIT
#pragma once

#include <git2/strarray.h>
#include <git2/types.h>

#include "main/files/HeldEntries.hpp"

namespace vclink::git
{

/// Holds the changed files that are not listed, so that git_index_add_all makes no text comparison
/// of them, which it does of all. git_pathspec_matches_path.
/// @throws LibGit2Exception if the index cannot be read again after a failure
void holdChangedFiles(git_repository *repository, git_index *index, const git_strarray &listed,
                      HeldEntries &held);

} // namespace vclink::git
