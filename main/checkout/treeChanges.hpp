// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <memory>
#include <string>

#include <git2/index.h>
#include <git2/tree.h>
#include <git2/types.h>

#include "util/repository/objectIds.hpp"

namespace vclink::git
{

/// A file, link or submodule that differs between two trees. A name that is a folder in one tree
/// and a file in the other is reported as the file and as each file of the folder.
struct TreeChange
{
    /// relative to the root
    const std::string &path;
    /// null if that tree has no file of this name
    const git_tree_entry *before;
    const git_tree_entry *after;
};

inline bool isTree(const git_tree_entry *entry)
{
    return git_tree_entry_type(entry) == GIT_OBJECT_TREE;
}

/// Returns true if a file stays a file, as in most changes. Fewer rules apply to it.
inline bool staysFile(const TreeChange &change)
{
    const auto isFile = [](const git_tree_entry *entry)
    {
        const git_filemode_t mode =
            entry != nullptr ? git_tree_entry_filemode(entry) : GIT_FILEMODE_UNREADABLE;
        return mode == GIT_FILEMODE_BLOB || mode == GIT_FILEMODE_BLOB_EXECUTABLE;
    };
    return isFile(change.before) && isFile(change.after);
}

/// Returns true if the index has the entry of one side.
inline bool isOf(const git_index_entry &entry, const git_tree_entry *side)
{
    return side != nullptr && isSameId(entry.id, *git_tree_entry_id(side)) &&
           entry.mode == static_cast<unsigned>(git_tree_entry_filemode(side));
}

struct FreeTreeEntry
{
    void operator()(git_tree_entry *entry) const
    {
        git_tree_entry_free(entry);
    }
};
using OwnedTreeEntry = std::unique_ptr<git_tree_entry, FreeTreeEntry>;

/// Returns the tree's file or folder of this name, null if it has none. git_tree_entry_bypath.
/// @param tree null means the empty tree
/// @throws LibGit2Exception if a tree on the way cannot be read
OwnedTreeEntry findInTree(const git_tree *tree, const std::string &path);

/// Returns true if the tree has a folder of this name. See findInTree.
bool isFolderIn(const git_tree *tree, const std::string &path);

/// Visits what differs, in path order, until `visit` returns false. Does not read equal folders.
/// git_diff_tree_to_tree returns the same at several times the cost.
/// @param before, after null means the empty tree
/// @throws LibGit2Exception if a tree cannot be read, and what `visit` throws
void visitTreeChanges(git_repository *repository, const git_tree *before, const git_tree *after,
                      const std::function<bool(const TreeChange &)> &visit);

} // namespace vclink::git
