// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>
#include <vector>

#include <git2/errors.h>
#include <git2/merge.h>
#include <git2/oid.h>
#include <git2/oidarray.h>
#include <git2/types.h>

#include "error/errorUtil/GitResult.hpp"

namespace vclink::git
{

/// Owns the result of git_merge_bases.
class MergeBases
{
  public:
    /// Has none for unrelated histories.
    MergeBases(git_repository *repository, const git_oid *ours, const git_oid *theirs)
        // Delegates, so that the destructor releases what a failing call has left.
        : MergeBases()
    {
        const GitResult<void> found = call(git_merge_bases, &array_, repository, ours, theirs);
        if (!found.has_error() || found.error().getCode() != GIT_ENOTFOUND)
        {
            found.value();
        }
    }
    MergeBases(const MergeBases &) = delete;
    MergeBases &operator=(const MergeBases &) = delete;
    ~MergeBases()
    {
        git_oidarray_dispose(&array_);
    }

    std::size_t size() const
    {
        return array_.count;
    }
    const git_oid *at(std::size_t index) const
    {
        return &array_.ids[index];
    }

  private:
    MergeBases() = default;

    git_oidarray array_{};
};

/// Returns the trees of the merge bases; for unrelated histories one that is null, the empty tree.
/// git_commit_lookup, git_commit_tree.
/// @throws LibGit2Exception
std::vector<OwnedHandle<git_tree>> readTrees(git_repository *repository, const MergeBases &bases);

} // namespace vclink::git
