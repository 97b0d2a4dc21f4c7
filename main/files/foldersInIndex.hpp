// SPDX-License-Identifier: MIT
#pragma once

#include <git2/types.h>

namespace vclink::git
{

class PathspecArray;

/// Removes an entry such as `a/b` from the index, in memory, if the index also has the file `a`.
/// git cannot commit an index with both. When libgit2 adds `a`, it removes only those that the
/// pattern for `a` matches, and a pattern with a wildcard or an escape may match none.
/// git_index_remove.
/// @param pathspec the patterns whose files were added
/// @return true if there was anything to remove
/// @throws LibGit2Exception
bool takeOutBelowFiles(git_index *index, const PathspecArray &pathspec);

/// Whether there is anything below a file of the index.
bool hasFilesBelowFiles(git_index *index);

} // namespace vclink::git
