// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include <git2/types.h>

#include "main/mergeState/MergeSides.hpp"

namespace vclink::git
{

/// A file in the repository's folder that exists while libgit2 merges: `vclink-merge`, with the ids
/// of HEAD and of the merged commit. If the process is killed, the file stays, and shows the next
/// commit that some of the other side's work may be missing. Removes git's own sign of a
/// complete merge, `AUTO_MERGE`, and restores it if no merge is under way at the end.
class MergeMarker
{
  public:
    /// Creates the marker and removes that of an earlier merge. The index must be locked, and no
    /// merge under way.
    /// @param repository outlives the object
    /// @throws LibGit2Exception if the file cannot be written
    [[nodiscard]] MergeMarker(git_repository *repository, const MergeSides &sides);
    MergeMarker(const MergeMarker &) = delete;
    MergeMarker &operator=(const MergeMarker &) = delete;
    ~MergeMarker();

  private:
    git_repository *repository_;
    std::string path_;
    std::string autoMergePath_;
    /// The content of that file, empty for none.
    std::string autoMerge_;
};

/// Returns true if a merge of `theirs` was interrupted in this repository, with any HEAD: the rest
/// of a merge survives a switch of the branch. An incomplete or damaged marker counts.
/// @throws LibGit2Exception if this cannot be found out
[[nodiscard]] bool hasMergeMarker(git_repository *repository, const git_oid &theirs);

/// Removes the marker of a merge that has ended. The index must be locked, and no merge under way.
void removeMergeMarker(git_repository *repository) noexcept;

} // namespace vclink::git
