// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

#include <git2/oid.h>
#include <git2/types.h>

#include "error/errorUtil/OwnedHandle.hpp"
#include "main/checkout/WorkingCopy.hpp"
#include "main/checkout/treeChanges.hpp"

namespace vclink::git
{

/// The submodules that come or go in a switch or a fast-forward. git never touches the folder of
/// one; libgit2 deletes it with all it holds where the submodule goes, and deletes an ignored
/// folder or fails at another one where a submodule comes. So the checkout gets a baseline in which
/// these submodules are as in the target, and has nothing to do for them. Their entries in the
/// index are settled afterwards.
class SwitchSubmodules
{
  public:
    /// Looks at one change of the switch.
    /// @return whether a folder is to be kept, which libgit2 deletes under GIT_CHECKOUT_FORCE
    /// whatever the baseline holds
    bool note(WorkingCopy &copy, const TreeChange &change);

    /// Whether HEAD's tree, which is libgit2's own baseline, will do.
    bool isEmpty() const noexcept;

    /// An index in memory for the checkout's `baseline_index`. git_index_new, git_index_read_tree,
    /// git_index_remove, git_index_add.
    /// @throws LibGit2Exception
    [[nodiscard]] OwnedHandle<git_index> makeBaseline(const WorkingCopy &copy) const;

    /// Brings the index, in memory, to what the target has. git_index_remove, git_index_add.
    /// @throws LibGit2Exception
    void settle(git_index *index) const;

  private:
    struct Coming
    {
        std::string path;
        git_oid id;
    };

    void addComing(git_index *index) const;

    /// A folder with files is in the place.
    std::vector<Coming> coming_;
    std::vector<std::string> going_;
    /// Submodules that become files, and files that become submodules, while nothing is there:
    /// libgit2 makes the new one only if the baseline does not have the old one.
    std::vector<std::string> replaced_;
};

} // namespace vclink::git
