// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

#include <git2/types.h>

namespace vclink::git
{

/// Entries of an index that libgit2 does not compare with the working tree: they have the
/// assume-unchanged flag, in memory, until they are given back. The index must not be written
/// before.
class HeldEntries
{
  public:
    /// Holds an entry without a conflict; does nothing if there is none. The path is one that the
    /// user has not assumed unchanged.
    void hold(git_index *index, const std::string &path);

    /// Holds what a sparse checkout leaves out, which git_index_update_all would remove.
    void holdLeftOut(git_index *index);

    /// Clears the flags.
    void giveBack(git_index *index) noexcept;

  private:
    std::vector<std::string> paths_;
};

} // namespace vclink::git
