// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

#include <git2/oid.h>
#include <git2/types.h>

#include "error/errorUtil/OwnedHandle.hpp"
#include "main/checkout/WorkingCopy.hpp"
#include "main/checkout/gitlinks.hpp"
#include "main/checkout/treeChanges.hpp"

namespace vclink::git
{

/// The submodules that a switch or a fast-forward adds or removes. git never touches their folders.
/// libgit2 deletes the folder of a removed submodule with all its content. In the place of a new
/// submodule it deletes an ignored folder, and fails at any other. Therefore the checkout gets a
/// baseline in which these submodules are as in the target, and does nothing for them. Their
/// entries in the index are set afterwards.
class SwitchSubmodules
{
  public:
    /// Examines one change of the switch.
    /// @return true if a folder must be kept; with GIT_CHECKOUT_FORCE libgit2 deletes it whatever
    /// the baseline is
    bool note(WorkingCopy &copy, const TreeChange &change);

    /// Returns true if HEAD's tree, libgit2's own baseline, is sufficient.
    bool isEmpty() const noexcept;

    /// Returns an index in memory for the checkout's `baseline_index`. git_index_new,
    /// git_index_read_tree, git_index_remove, git_index_add.
    /// @throws LibGit2Exception
    [[nodiscard]] OwnedHandle<git_index> makeBaseline(const WorkingCopy &copy) const;

    /// Sets the entries in the index, in memory, to those of the target. git_index_remove,
    /// git_index_add.
    /// @throws LibGit2Exception
    void settle(git_index *index) const;

  private:
    /// Those that have a folder with files in their place.
    std::vector<Gitlink> coming_;
    std::vector<std::string> going_;
    /// Submodules that become files, and files that become submodules, if nothing is in their
    /// place: libgit2 creates the new one only if the baseline does not have the old one.
    std::vector<std::string> replaced_;
};

} // namespace vclink::git
