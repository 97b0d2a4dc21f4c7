// SPDX-License-Identifier: MIT
#pragma once

#include <vector>

#include <git2/types.h>

#include "util/repository/ChangedFiles.hpp"

namespace vclink::git
{

/// Before libgit2 1.6, git_index_update_all and git_index_add_all end the process if a tracked file
/// is empty now and is converted as it is read, by line ends or `ident`. Both compare the text of
/// every modified tracked file, listed or not, and free a static buffer for such a file. A file
/// that is staged by its path needs no comparison. Call before them for the changed files that they
/// stage, and hold the others: see HeldEntries. Stages the empty ones that are not staged yet, in
/// memory. git_index_add_bypath.
///
/// Also stages those that are only intended to be added (`git add --intent-to-add`), with any
/// release: libgit2 would commit them and leave the mark, with which git's next commit would delete
/// them.
///
/// It does not help if another program empties a file after it was examined.
/// @throws LibGit2Exception
void stageEmptiedFiles(git_repository *repository, git_index *index,
                       const std::vector<ChangedFile> &files);

} // namespace vclink::git
