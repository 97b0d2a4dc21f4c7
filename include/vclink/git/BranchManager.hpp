// SPDX-License-Identifier: MIT
#pragma once

#include <memory>
#include <string>
#include <vector>

#include "vclink/CMAdapter.hpp"
#include "vclink/git/BranchParameters.hpp"
#include "vclink/git/BranchPointer.hpp"
#include "vclink/git/export.hpp"

struct git_oid;

namespace vclink::git
{

/// The branches of one working copy. Each operation opens the repository of the adapter, runs to
/// its end on the calling thread, and keeps nothing. Names and revisions are UTF-8. For one thread
/// at a time, as its adapter.
///
/// Unless an operation says otherwise it throws LibGit2Exception, with libgit2's text, when a call
/// to libgit2 fails, and nothing has changed then. A name or revision with a NUL character is
/// refused with GIT_EINVALIDSPEC before anything is opened. The order of the operations is binding.
///
/// switchBranch and merge hold git's lock of the index while they work. While something else holds
/// it, they fail with GIT_ELOCKED before anything is written. A reference that is locked is tried
/// again for `core.filesRefLockTimeout` milliseconds, 100 by default, one minute if negative.
class VCLINK_GIT_EXPORT BranchManager
{
  public:
    /// UTF-8; a short name, or what an operation says it takes.
    using BranchName = std::string;

    /// @param adapter one that GitAdapterFactory has made; must outlive the manager
    /// @throws std::bad_cast for any other adapter
    [[nodiscard]] static std::unique_ptr<BranchManager> create(vclink::CMAdapter &adapter);

    BranchManager() = default;
    BranchManager(const BranchManager &) = delete;
    BranchManager &operator=(const BranchManager &) = delete;
    virtual ~BranchManager();

    /// Full names, beginning with "refs/heads/", in libgit2's order. git_branch_next.
    virtual std::vector<BranchPointer> getLocalBranches() const = 0;
    /// Full names, beginning with "refs/remotes/", in libgit2's order. git_branch_next.
    virtual std::vector<BranchPointer> getRemoteBranches() const = 0;

    /// The id of HEAD, 40 hexadecimal digits; getRevision("HEAD").
    virtual std::string getHeadRevision() const = 0;
    /// The id of the object that a revision text names, 40 hexadecimal digits.
    /// git_revparse_single.
    virtual std::string getRevision(const std::string &revision) const = 0;
    /// The same id, its 20 bytes.
    virtual git_oid getRevisionId(const std::string &revision) const = 0;

    /// Checks a local branch out and moves HEAD to it. Changes of the user that the branch does not
    /// touch stay. The switch is refused before anything is written if it would lose uncommitted
    /// changes, staged or not, or untracked files, and if a symbolic link, FIFO, socket or device
    /// is in its way. An ignored file that the branch tracks is overwritten. The folder of a
    /// submodule stays as it is, also where the branch has no such submodule; one that would become
    /// a file or a folder refuses the switch while it holds files. If a tag has the same name, its
    /// tree is checked out. Reports progress. After a failure or a cancellation HEAD is
    /// where it was; the files are too, unless one of them, or HEAD itself, couldn't be written.
    /// git_branch_lookup, git_revparse_single, git_checkout_tree, git_repository_set_head.
    /// @param name the short name
    /// @throws LibGit2Exception, with code GIT_ECONFLICT and class GIT_ERROR_CHECKOUT if the switch
    /// is refused
    /// @throws vclink::util::exception::CancelledOperationException
    virtual void switchBranch(const BranchName &name) = 0;

    /// Makes a local branch; HEAD stays. An existing branch of the name is a failure.
    /// git_branch_create.
    virtual void createBranch(const BranchParameters &parameters) = 0;

    /// Deletes a local branch, merged or not; the one that HEAD points at is a failure.
    /// git_branch_delete.
    virtual void deleteBranch(const BranchName &name) = 0;

    /// The short name of the branch that HEAD points at. A repository without a commit and one with
    /// a detached HEAD have none, which is a failure. git_repository_head, git_branch_name.
    virtual BranchPointer getCurrentBranch() const = 0;

    /// Merges a branch, or the commit that any revision text names (an annotated tag as
    /// "tag^{commit}"), into the current branch: does nothing when it is merged already,
    /// fast-forwards where that is possible and `merge.ff` allows it, and otherwise makes a merge
    /// commit, running the merge drivers that the repository's configuration and attributes name.
    /// Reports progress.
    ///
    /// A fast-forward is refused as switchBranch is. A merge that is none is refused before
    /// anything is written if any tracked file has uncommitted changes, even one that the merge
    /// does not touch, and if it would overwrite an untracked file, or a symbolic link, FIFO,
    /// socket or device is in its way; the added text names the first file, but for files that the
    /// merge touches itself, which libgit2 only counts. The merge drivers may have run by then.
    /// Missing files come back, ignored ones are overwritten. Folders of submodules stay as they
    /// are; the merge commit has the submodules' commits as merged, whatever is checked out in
    /// them.
    ///
    /// After conflicts the repository is in the state of a merge. Files in conflict have markers
    /// where both sides changed the same lines; a file that a merge command refused may have none,
    /// and be a mix of both sides. Files whose content must not be mixed are ours.
    /// CMAdapter::markResolved and CMAdapter::commit go on. git_merge_analysis, git_checkout_tree,
    /// git_merge.
    /// @throws GitException with the message shared_vclink::git::MergeFailed, whose added text
    /// tells the cause, a cancellation and conflicts included
    virtual void merge(BranchName name) = 0;

    /// The repository's state in words: "Normal", "Conflicts" while a merge, revert or cherry-pick
    /// is under way, "Bisecting", "Rebase", "Rebase interactive", "Rebase w/merge", "Apply
    /// mailbox", "Rebase/Apply mailbox". Throws only if the repository cannot be opened.
    /// git_repository_state.
    virtual std::string getRepositoryState() const = 0;
};

} // namespace vclink::git
