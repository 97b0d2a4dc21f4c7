// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include <git2/types.h>

namespace vclink::git
{

/// Returns true if a pattern that begins with '!' may exempt a file from being ignored. libgit2
/// does not apply such a pattern unless it negates another one of the same file, so that it takes
/// untracked files for ignored ones. Also returns true if a file with patterns cannot be read, is
/// a symbolic link in the working tree, which git does not follow, is left out by a sparse
/// checkout, where git reads it from the index, or has a pattern that has another meaning in git,
/// such as one with a tab or a backslash at its end, or one that ends with '/' for a link.
/// @param index that of the repository
/// @param root the working tree, with a slash at its end
/// @param name relative to the root
/// @throws LibGit2Exception if the setting `core.excludesFile` cannot be read
bool mayBeNegated(git_repository *repository, git_index *index, const std::string &root,
                  const std::string &name);

} // namespace vclink::git
