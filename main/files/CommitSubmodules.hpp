// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

#include <git2/index.h>
#include <git2/types.h>

namespace vclink::git
{

/// Keeps the submodules over the refresh of a commit.
///
/// The refresh takes the commit that is checked out in each. In a merge that is still ours if the
/// other side has moved the submodule: the merge would undo the move, and no later one would bring
/// it back. A submodule in conflict it takes for deleted.
class CommitSubmodules
{
  public:
    /// Notes the submodules that the index and one of the commit's parents have. Where libgit2
    /// could not write a file, the index has whatever the memory held in place of its mode, a
    /// submodule's for example. git_commit_tree, git_tree_entry_bypath.
    /// @throws LibGit2Exception
    CommitSubmodules(git_repository *repository, git_index *index,
                     const std::vector<const git_commit *> &parents);

    /// Resolves submodules in conflict to ours, in memory, so that the refresh takes them as they
    /// are checked out. One that ours has removed is resolved to theirs if its repository is in the
    /// folder, otherwise it stays removed. git_index_remove, git_index_add.
    /// @throws LibGit2Exception
    void resolve(git_index *index) const;

    /// Takes them out of the index, in memory, so that the refresh does not look at them: it fails
    /// at a repository without a commit. git_index_remove.
    /// @throws LibGit2Exception
    void takeOut(git_index *index) const;

    /// Puts back those that were not in conflict, in memory. git_index_add.
    /// @param head if given, only where HEAD's commit of the submodule is checked out: another one
    /// is the user's choice, and a folder that is gone counts as deleted
    /// @throws LibGit2Exception
    void restore(git_index *index, const git_commit *head) const;

  private:
    struct Submodule
    {
        std::string path;
        git_index_entry entry;
    };

    std::vector<Submodule> submodules_;
    /// One side of each of those in conflict.
    std::vector<Submodule> conflicts_;
};

} // namespace vclink::git
