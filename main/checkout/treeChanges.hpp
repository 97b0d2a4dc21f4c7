// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <string>

#include <git2/types.h>

namespace vclink::git
{

/// A file, link or submodule that two trees hold differently. A name that is a folder in one tree
/// and a file in the other comes as the file and as each file of the folder.
struct TreeChange
{
    /// relative to the root
    const std::string &path;
    /// null if that tree has no file of this name
    const git_tree_entry *before;
    const git_tree_entry *after;
};

/// Visits what differs, in path order, until `visit` returns false. git_diff_tree_to_tree gives the
/// same for several times the cost. Folders that are equal are not read.
/// @param before, after null means the empty tree
/// @throws LibGit2Exception if a tree cannot be read, and what `visit` throws
void visitTreeChanges(git_repository *repository, const git_tree *before, const git_tree *after,
                      const std::function<bool(const TreeChange &)> &visit);

} // namespace vclink::git
