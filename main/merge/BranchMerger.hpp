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

/// Carries out one merge. Made for it, and gone with it.
class BranchMerger
{
  public:
    using BranchName = BranchManager::BranchName;

    /// @param adapter, callbacks outlive the merge
    BranchMerger(GitAdapter &adapter, std::shared_ptr<GitOptionsFactory> optionsFactory,
                 GitCallbacks &callbacks);

    /// Merges what `name` names into the current branch. See BranchManager::merge.
    /// @throws GitException with the message MergeFailed
    void performMerge(const BranchName &name);

    /// Moves the working tree to `theirs`, and then the current branch.
    /// @throws LibGit2Exception, vclink::util::exception::CancelledOperationException: the branch
    /// is where it was
    void fastForward(git_repository *repository, git_annotated_commit *theirs);

    /// Merges the trees, and commits the result.
    /// @throws the exception of shared_vclink::git::HasConflicts when files are left in conflict,
    /// LibGit2Exception, and what GitAdapter::commit and the merge drivers raise
    void threeWayMerge(const BranchName &name, git_repository *repository,
                       git_annotated_commit *theirs);

  private:
    void decide(const BranchName &name, git_repository *repository);
    /// To be asked again once the index is locked: until then another process may begin something.
    static void refuseOtherStates(git_repository *repository);
    void commitMerge(const BranchName &name, git_repository *repository, const MergeSides &sides);
    [[noreturn]] void endWithConflicts(git_repository *repository, git_index *index,
                                       const git_checkout_options &options, IndexLock &lock);

    GitAdapter &adapter_;
    std::shared_ptr<GitOptionsFactory> optionsFactory_;
    GitCallbacks *callbacks_;
};

/// Appends the path of an entry in conflict whose content must not be mixed with conflict markers,
/// by the attributes `merge` and `text` of the file. A missing stage adds nothing.
void collectUnmergeable(git_repository *repository, std::vector<ustring> &paths,
                        const git_index_entry *entry);

/// For the log: the names of the bits that are set, each with a blank behind it.
std::string mergeAnalysisToText(unsigned analysis);
std::string mergePreferenceToText(unsigned preference);

} // namespace vclink::git
