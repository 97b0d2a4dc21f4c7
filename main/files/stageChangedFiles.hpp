// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

#include <git2/types.h>

#include "main/files/HeldEntries.hpp"
#include "util/repository/ChangedFiles.hpp"

namespace vclink::git
{

/// Stages modified files and removes missing ones, each by its path, in memory: as
/// git_index_update_all and git_index_add_all do, but without the comparison of texts that they
/// make of each of them. That costs more than to store the file. Both must be called afterwards:
/// they stage what is left here, which is all that may depend on other entries, and links.
/// git_diff_index_to_workdir, git_index_add_bypath, git_index_remove_bypath.
///
/// If a path fails, the index is read again. The call that follows reports the failure then.
/// @param files those of `changed` that are to be staged
/// @param held gets files that look changed and are not, so that their content is not read again
/// @return the paths of the removed files; each may exist again since
/// @throws LibGit2Exception if the index cannot be read again
std::vector<std::string> stageChangedFiles(git_repository *repository, git_index *index,
                                           const ChangedFiles &changed,
                                           const std::vector<ChangedFile> &files,
                                           HeldEntries &held);

} // namespace vclink::git
