// SPDX-License-Identifier: MIT
#pragma once

#include <memory>
#include <string>
#include <vector>

#include <git2/types.h>

#include "fl/ustring.hpp"
#include "main/files/GitAdapter.hpp"
#include "vclink/git/BranchManager.hpp"

struct git_index_entry;

namespace vclink::git
{

class IndexLock;
struct MergeSides;

/// Carries out one merge, and lives only as long as that.
class BranchMerger
{
  public:
    using BranchName = BranchManager::BranchName;

    /// @param adapter, callbacks outlive the merge
    BranchMerger(GitAdapter &adapter, std::shared_ptr<GitOptionsFactory> optionsFactory,
                 GitCallbacks &callbacks);

    /// Merges a branch or revision into the current branch. See BranchManager::merge.
    /// @throws GitException with the message MergeFailed
    void performMerge(const BranchName &name);

    /// Changes the working tree to `theirs`, then moves the current branch.
    /// @throws LibGit2Exception, vclink::util::exception::CancelledOperationException; then the
    /// branch is unchanged
    void fastForward(git_repository *repository, git_annotated_commit *theirs);

    /// Merges the trees, and commits the result.
    /// @throws the exception of shared_vclink::git::HasConflicts if files are in conflict,
    /// LibGit2Exception, and what GitAdapter::commit and the merge drivers throw
    void threeWayMerge(const BranchName &name, git_repository *repository,
                       git_annotated_commit *theirs);

  private:
    void decide(const BranchName &name, git_repository *repository);
    /// Call it again when the index is locked: until then another process may begin an operation.
    static void refuseOtherStates(git_repository *repository);
    /// Waits for the branch's lock, and refuses reflogs that cannot be appended to.
    static void awaitWritableBranch(git_repository *repository, const git_reference *head);
    void commitMerge(const BranchName &name, git_repository *repository, const MergeSides &sides);
    [[noreturn]] void endWithConflicts(git_repository *repository, git_index *index,
                                       const git_checkout_options &options, IndexLock &lock);

    GitAdapter &adapter_;
    std::shared_ptr<GitOptionsFactory> optionsFactory_;
    GitCallbacks *callbacks_;
};

/// Appends the path of an entry in conflict if its content must not have conflict markers,
/// according to the file's attributes `merge` and `text`. Adds nothing for a missing stage.
void collectUnmergeable(git_repository *repository, std::vector<ustring> &paths,
                        const git_index_entry *entry);

/// Returns the names of the set bits for the log, each followed by a blank.
std::string mergeAnalysisToText(unsigned analysis);
std::string mergePreferenceToText(unsigned preference);

} // namespace vclink::git
