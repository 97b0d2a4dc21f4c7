// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

#include <git2/index.h>
#include <git2/types.h>

namespace vclink::git
{

/// Protects the entries of submodules from the refresh of a commit.
///
/// The refresh records the commit that is checked out in each submodule. In a merge that is still
/// our commit if the other side has moved the submodule: the merge would undo the move, and no
/// later merge would restore it. The refresh treats a submodule in conflict as deleted.
class CommitSubmodules
{
  public:
    /// Notes the submodules that the index and one of the commit's parents have. The index alone is
    /// not enough: if libgit2 could not write a file, its mode in the index is random memory, which
    /// can be that of a submodule. git_commit_tree, git_tree_entry_bypath.
    /// @throws LibGit2Exception
    CommitSubmodules(git_repository *repository, git_index *index,
                     const std::vector<const git_commit *> &parents);

    /// Resolves submodules in conflict to ours, in memory, so that the refresh records them as they
    /// are checked out. Resolves a submodule that we have removed to theirs if its repository is in
    /// the folder; otherwise it stays removed. git_index_remove, git_index_add.
    /// @throws LibGit2Exception
    void resolve(git_index *index) const;

    /// Removes the submodules from the index, in memory, so that the refresh does not look at them:
    /// it fails for a repository without a commit. git_index_remove.
    /// @throws LibGit2Exception
    void takeOut(git_index *index) const;

    /// Restores those that were not in conflict, in memory. git_index_add.
    /// @param head if given, restores only those with HEAD's commit of the submodule checked out:
    /// another commit is the user's choice, and a missing folder counts as deleted
    /// @throws LibGit2Exception
    void restore(git_index *index, const git_commit *head) const;

  private:
    struct Submodule
    {
        std::string path;
        git_index_entry entry;
    };

    std::vector<Submodule> submodules_;
    /// One side of each submodule in conflict.
    std::vector<Submodule> conflicts_;
};

} // namespace vclink::git
