// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

#include <git2/oid.h>
#include <git2/types.h>

#include "main/checkout/WorkingCopy.hpp"
#include "main/checkout/treeChanges.hpp"

namespace vclink::git
{

/// The submodules that come or go in a merge, whose folders stay as they are. libgit2 refuses to
/// merge where the folder of one that comes is there already, and leaves the entry of one that goes
/// in the index.
class MergeSubmodules
{
  public:
    /// Looks at what the other side has changed.
    void noteChange(WorkingCopy &copy, const TreeChange &change);

    /// Stages the submodules that come, in memory only. What is staged as the merge will have it is
    /// no change that libgit2 refuses to overwrite; if the merge has something else in the end, it
    /// is refused as for anything staged. git_index_add.
    /// @throws LibGit2Exception
    void stage(git_index *index) const;

    /// Looks at what is untracked in the result of the merge.
    /// @param name of a folder
    void noteUntracked(const WorkingCopy &copy, const std::string &name);

    /// Whether there is nothing to settle.
    bool isEmpty() const noexcept;

    /// Takes what is gone out of the index, in memory, unless it is in conflict. git_index_remove.
    /// @throws LibGit2Exception
    void settle(git_index *index) const;

  private:
    struct Coming
    {
        std::string path;
        git_oid id;
    };

    std::vector<Coming> coming_;
    std::vector<std::string> going_;
};

} // namespace vclink::git
