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

/// Lists, creates, deletes, switches and merges the branches of one working copy.
///
/// Each operation opens the repository of the adapter, runs to its end on the calling thread, and
/// keeps nothing. Names and revisions are UTF-8. Use it on one thread at a time, the adapter's. The
/// order of the operations is part of the binary interface.
///
/// Unless its description says otherwise, an operation throws LibGit2Exception with libgit2's text
/// if a call to libgit2 fails, and then nothing has changed. A name or revision with a NUL
/// character throws with GIT_EINVALIDSPEC before anything is opened.
///
/// switchBranch and merge hold git's index lock while they work. If something else holds it,
/// nothing is written: switchBranch throws with GIT_ELOCKED, and merge throws GitException, whose
/// added text names the lock. A merge gives the lock up once, after its files and index are written
/// and before its commit, and then waits up to a second for it. If another process has locked a
/// reference, an operation tries again for `core.filesRefLockTimeout` milliseconds: 100 by default,
/// one minute if negative. Both also refuse the patterns and settings that the adapter's operations
/// refuse: see @ref adapter_common.
class VCLINK_GIT_EXPORT BranchManager
{
  public:
    /// UTF-8; a short name, unless an operation says otherwise.
    using BranchName = std::string;

    /// Creates a manager for the branches of the adapter's working copy.
    /// @param adapter must be from GitAdapterFactory, and must outlive the manager
    /// @throws std::bad_cast for any other adapter
    [[nodiscard]] static std::unique_ptr<BranchManager> create(vclink::CMAdapter &adapter);

    BranchManager() = default;
    BranchManager(const BranchManager &) = delete;
    BranchManager &operator=(const BranchManager &) = delete;
    virtual ~BranchManager();

    /// Returns the full names of the local branches, beginning with "refs/heads/", in libgit2's
    /// order. Those that libgit2 leaves out because of a broken link below `refs/` come last.
    /// Throws if two symbolic links there lead back to folders that contain them, because the list
    /// would have no end. git_branch_next.
    virtual std::vector<BranchPointer> getLocalBranches() const = 0;
    /// Returns the full names of the remote-tracking branches, beginning with "refs/remotes/", in
    /// libgit2's order, as getLocalBranches. git_branch_next.
    virtual std::vector<BranchPointer> getRemoteBranches() const = 0;

    /// Returns the id of HEAD, 40 hexadecimal digits, as getRevision("HEAD") does.
    virtual std::string getHeadRevision() const = 0;
    /// Returns the id of the object that a revision text names, 40 hexadecimal digits.
    /// git_revparse_single.
    virtual std::string getRevision(const std::string &revision) const = 0;
    /// Returns the same id as 20 bytes.
    virtual git_oid getRevisionId(const std::string &revision) const = 0;

    /// Makes a local branch the current one: checks out its files and moves HEAD to it. Reports
    /// progress.
    ///
    /// Refuses before anything is written if it would lose uncommitted changes, staged or not, or
    /// untracked files, and if a symbolic link, FIFO, socket or device is in the way. Also refuses
    /// if a submodule would become a file or a folder while its folder contains files. Overwrites
    /// an ignored file that the branch tracks. Keeps changes in files that are the same in both
    /// branches, and the folders of submodules, even if the branch does not have them.
    ///
    /// Also refuses while a merge, revert, cherry-pick, rebase or `git am` is under way, and, with
    /// other codes, if another working tree of the repository has the branch checked out
    /// (GIT_ERROR), if HEAD is a symbolic link or cannot be written (GIT_ERROR), or if HEAD or the
    /// branch moves during the switch (GIT_EMODIFIED).
    /// Throws with GIT_EAMBIGUOUS if libgit2 finds something else by the branch's name, for example
    /// a tag of another commit, or a stash.
    ///
    /// After a failure or a cancellation HEAD is unchanged. The files are unchanged too, unless a
    /// file, the index or HEAD could not be written, or another process moved or deleted the branch
    /// while the files were written. Then some or all files are those of the branch, and the next
    /// commit would record them on the old branch. git_branch_lookup, git_revparse_single,
    /// git_checkout_tree, git_repository_set_head.
    /// @param name the short name
    /// @throws LibGit2Exception with code GIT_ECONFLICT and class GIT_ERROR_CHECKOUT if it refuses
    /// because of files or an operation under way
    /// @throws vclink::util::exception::CancelledOperationException
    virtual void switchBranch(const BranchName &name) = 0;

    /// Creates a local branch without switching to it. Fails if the branch exists.
    /// git_branch_create.
    virtual void createBranch(const BranchParameters &parameters) = 0;

    /// Deletes a local branch, merged or not: commits that only it had can be lost. Fails for the
    /// current branch of any working tree of the repository, even if its folder is gone, and for
    /// one that a rebase or bisection needs. Also removes its settings from the repository's own
    /// configuration file: if that fails at the end, the branch is gone. git_branch_delete,
    /// git_config_delete_entry, git_config_delete_multivar.
    virtual void deleteBranch(const BranchName &name) = 0;

    /// Returns the short name of the current branch, which HEAD points to. Fails if the repository
    /// has no commit or HEAD is detached. git_repository_head, git_branch_name.
    virtual BranchPointer getCurrentBranch() const = 0;

    /// Merges a branch or another commit into the current branch. Reports progress.
    ///
    /// Does nothing if it is merged already. Fast-forwards if that is possible and `merge.ff`
    /// allows it. Otherwise makes a merge commit, and runs the merge drivers that the repository's
    /// configuration and attributes name.
    ///
    /// A fast-forward refuses as switchBranch does. Any other merge refuses before anything is
    /// written
    /// - if a tracked file has uncommitted changes, even a file that the merge does not touch,
    /// - if it would overwrite an untracked file, or
    /// - if a symbolic link, FIFO, socket or device is in the way.
    ///
    /// The merge drivers may have run by then. docs/limitations.md has more cases. The added text
    /// names the first such file. If all changes are staged, the text has only the number of such
    /// files.
    ///
    /// Restores missing files and overwrites ignored ones. Keeps the folders of submodules; the
    /// merge commit records the submodules' commits as merged, whatever is checked out in them.
    ///
    /// After conflicts the repository is in the state of a merge: continue with
    /// CMAdapter::markResolved and CMAdapter::commit. Files in conflict have markers if both sides
    /// changed the same lines. A file that a merge command refused can be a mix of both sides
    /// without markers. Files with the attribute `-merge`, or with `-text` and a driver's name,
    /// have our version. git_merge_analysis, git_checkout_tree, git_merge.
    /// @param name the branch, or any revision text; "tag^{commit}" for an annotated tag
    /// @throws GitException with the message shared_vclink::git::MergeFailed for every failure,
    /// including cancellation and conflicts; the added text has the cause
    virtual void merge(BranchName name) = 0;

    /// Returns the repository's state in words: "Normal", "Conflicts" while a merge, revert or
    /// cherry-pick is under way (not between two steps of a series of them), "Bisecting", "Rebase",
    /// "Rebase interactive", "Rebase w/merge", "Apply mailbox", "Rebase/Apply mailbox". Throws only
    /// if the repository cannot be opened. git_repository_state.
    virtual std::string getRepositoryState() const = 0;
};

} // namespace vclink::git
