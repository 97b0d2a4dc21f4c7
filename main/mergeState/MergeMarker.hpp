// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include <git2/types.h>

#include "main/mergeState/MergeSides.hpp"

namespace vclink::git
{

/// A file in the repository's folder that stands while libgit2 merges: `vclink-merge`, with the ids
/// of HEAD and of the commit that is merged. If the process is killed, it stays, and tells the next
/// commit that not all of the other side's work may have been written.
class MergeMarker
{
  public:
    /// To be made while the index is locked and no merge is under way: what is left of an earlier
    /// merge goes.
    /// @throws LibGit2Exception if the file can't be written
    [[nodiscard]] MergeMarker(git_repository *repository, const MergeSides &sides);
    MergeMarker(const MergeMarker &) = delete;
    MergeMarker &operator=(const MergeMarker &) = delete;
    ~MergeMarker();

  private:
    std::string path_;
};

/// Whether a merge of `theirs` has been cut short in this repository, wherever HEAD was then: what
/// is left of the merge outlives a switch of the branch. A marker that was itself cut short counts.
/// @throws LibGit2Exception if that can't be found out
[[nodiscard]] bool hasMergeMarker(git_repository *repository, const git_oid &theirs);

/// Removes the marker of a merge that is over. To be called while the index is locked and no merge
/// is under way.
void removeMergeMarker(git_repository *repository) noexcept;

} // namespace vclink::git
