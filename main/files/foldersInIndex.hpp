// SPDX-License-Identifier: MIT
#pragma once

#include <git2/types.h>

namespace vclink::git
{

class PathspecArray;

/// Removes from the index, in memory, what is below a file of the index. git cannot commit an index
/// with both. libgit2 leaves it there when it adds the file, unless the file's pattern also matches
/// it; a pattern with a wildcard or an escape may not. git_index_remove.
/// @param pathspec the patterns whose files were added
/// @return true if there was anything to remove
/// @throws LibGit2Exception
bool takeOutBelowFiles(git_index *index, const PathspecArray &pathspec);

/// Whether there is anything below a file of the index.
bool hasFilesBelowFiles(git_index *index);

} // namespace vclink::git
