// SPDX-License-Identifier: MIT
#pragma once

#include <vector>

#include <git2/strarray.h>
#include <git2/types.h>

#include "main/files/HeldEntries.hpp"
#include "util/repository/ChangedFiles.hpp"

namespace vclink::git
{

/// Call before git_index_add_all, which compares the text of every changed file, listed or not.
/// Stages the listed ones by their paths as far as possible, in memory, and holds the others.
/// git_pathspec_matches_path.
/// @param held to be given back afterwards
/// @return the listed ones
/// @throws LibGit2Exception
std::vector<ChangedFile> prepareAddition(git_repository *repository, git_index *index,
                                         const git_strarray &listed, HeldEntries &held);

} // namespace vclink::git
