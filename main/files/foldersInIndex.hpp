// SPDX-License-Identifier: MIT
#pragma once

#include <git2/types.h>

namespace vclink::git
{

class PathspecArray;

/// Takes out of the index, in memory, what is below a file of it: the index cannot hold both, and
/// git could not commit it. libgit2 itself forgets what is below a file that it adds, unless the
/// file's pattern means that, too; a pattern with a wildcard or an escape may not.
/// git_index_remove_directory.
/// @param pathspec the patterns whose files were added
/// @return whether there was anything
/// @throws LibGit2Exception
bool takeOutBelowFiles(git_index *index, const PathspecArray &pathspec);

} // namespace vclink::git
