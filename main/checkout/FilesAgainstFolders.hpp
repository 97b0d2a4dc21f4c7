// SPDX-License-Identifier: MIT
#pragma once

#include <set>
#include <string>

#include <git2/types.h>

#include "main/checkout/Obstacle.hpp"
#include "main/checkout/WorkingCopy.hpp"
#include "main/checkout/treeChanges.hpp"

namespace vclink::git
{

/// A rule of a merge: finds a file that one side has renamed to the name of a folder in which the
/// other side has added or changed something, into a folder whose name is a file that the other
/// side has changed, or into a folder that the other side has replaced by a file. libgit2 would
/// fail in the middle of its writing, or merge neither the file nor the folder. If the renamed file
/// were a new one, libgit2 would have a conflict.
///
/// Also finds any name that is a file of one side and a folder of the other, and has both changed,
/// beside a name that sorts between the two, such as "lib.txt" for "lib", or if the first file of
/// the folder is not what changed: libgit2 would not see the conflict.
class FilesAgainstFolders
{
  public:
    /// Notes a name that is a file of one side and a folder of the other.
    /// @throws LibGit2Exception
    /// @param theirs the other side's tree
    void note(WorkingCopy &copy, const TreeChange &change, const git_tree *theirs);

    /// Looks for renames among the noted files. Compares the trees only if there are any.
    /// @param before the tree of a merge base, null for the empty tree
    /// @param theirs the other side's tree
    /// @throws LibGit2Exception
    Finding find(git_repository *repository, const WorkingCopy &copy, git_tree *before,
                 git_tree *theirs) const;

  private:
    void noteFolder(WorkingCopy &copy, const TreeChange &change, const git_tree *theirs);
    void noteFileAbove(WorkingCopy &copy, const std::string &path);

    std::set<std::string> filesOfOurs_;
    std::set<std::string> filesOfTheirs_;
    /// In the place of a file of the merge base that the other side has changed.
    std::set<std::string> foldersOfOurs_;
    std::set<std::string> foldersOfTheirs_;
    /// The folder whose parents were looked up last: names come in the order of folders.
    std::string folder_;
};

} // namespace vclink::git
