// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

#include <git2/index.h>

#include "error/errorUtil/GitResult.hpp"

namespace vclink::git
{

/// Entries of an index that git_index_update_all passes over, whatever is in the working tree:
/// they count as assumed unchanged, in memory, until they are given back. The index must not be
/// written before that.
class HeldEntries
{
  public:
    /// Holds an entry of stage 0 that does not count as assumed unchanged. Positions and addresses
    /// of the index's entries stay. git_index_add.
    GitResult<void> hold(git_index *index, const git_index_entry &entry);

    /// Holds what a sparse checkout leaves out. git_index_update_all would drop it.
    GitResult<void> holdLeftOut(git_index *index);

    /// Puts all entries back as they were. git_index_add.
    /// @throws LibGit2Exception
    void giveBack(git_index *index) const;

    /// Forgets them, and everything that the index has in memory only. git_index_read.
    /// @throws LibGit2Exception
    void readAgain(git_index *index);

  private:
    struct Held
    {
        std::string path;
        git_index_entry entry;
    };

    std::vector<Held> entries_;
};

/// Whether the entry is left out by a sparse checkout.
bool isLeftOut(const git_index_entry &entry) noexcept;

/// Whether the user has the entry assumed unchanged.
bool isAssumedUnchanged(const git_index_entry &entry) noexcept;

} // namespace vclink::git
