// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

#include <git2/oid.h>
#include <git2/types.h>

#include "main/checkout/WorkingCopy.hpp"
#include "main/checkout/gitlinks.hpp"
#include "main/checkout/treeChanges.hpp"

namespace vclink::git
{

/// The submodules that a merge adds or removes, and whose folders it keeps. libgit2 refuses to
/// merge if the folder of a new submodule already exists, and leaves the entry of a removed one in
/// the index.
class MergeSubmodules
{
  public:
    /// Examines a change of the other side.
    void noteChange(WorkingCopy &copy, const TreeChange &change);

    /// Stages the new submodules, in memory only. libgit2 does not refuse to overwrite a staged
    /// entry that equals the result of the merge. If the result is different, it refuses, as for
    /// every staged change. git_index_add.
    /// @throws LibGit2Exception
    void stage(git_index *index) const;

    /// Examines something that is untracked in the result of the merge.
    /// @param name the name of a folder
    void noteUntracked(WorkingCopy &copy, const std::string &name);

    /// Returns true if there is nothing to do afterwards.
    bool isEmpty() const noexcept;

    /// Removes the removed submodules from the index, in memory, except those in conflict.
    /// git_index_remove.
    /// @throws LibGit2Exception
    void settle(git_index *index) const;

  private:
    std::vector<Gitlink> coming_;
    std::vector<std::string> going_;
};

} // namespace vclink::git
