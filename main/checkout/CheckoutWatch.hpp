// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>
#include <exception>
#include <optional>
#include <string>
#include <vector>

#include <git2/checkout.h>
#include <git2/types.h>

#include "error/errorUtil/OwnedHandle.hpp"
#include "main/checkout/ClearedWay.hpp"
#include "main/checkout/MergeSubmodules.hpp"
#include "main/checkout/NewAttributes.hpp"
#include "main/checkout/Obstacle.hpp"
#include "main/checkout/PromisedContent.hpp"
#include "main/checkout/RemadeFiles.hpp"
#include "main/checkout/SwitchSubmodules.hpp"
#include "main/checkout/WorkingCopy.hpp"
#include "main/checkout/noticedObstacles.hpp"

namespace vclink::git
{

enum class CheckoutKind
{
    /// A switch or a fast-forward, with the strategy GIT_CHECKOUT_SAFE.
    Switch,
    /// A merge, with force.
    Merge,
    /// A revert of the user's list, with force.
    Revert
};

/// Watches one checkout, so that nothing is lost that Git cannot restore, and nothing is written
/// through a link or waits for a FIFO. libgit2 reports most files before it writes the first one;
/// the watch examines the others before.
///
/// Refuses with GIT_ECONFLICT, class GIT_ERROR_CHECKOUT and a text that names the first file,
/// before anything is written. Clears the way of a revert instead, as git does: replaces the links,
/// FIFOs, sockets and devices in it, and refuses what it cannot clear.
///
/// Also refuses a switch or a merge, with GIT_EMODIFIED, if HEAD has moved since the first look. If
/// HEAD moves later, the checkout still compares with the HEAD that was read, so that files of the
/// new commit are not deleted.
///
/// Also makes libgit2 write all files with the new attributes; see NewAttributes.
///
/// Calls the record's own notification first, so that a cancellation comes before a refusal. It
/// receives a refused file like any other conflict. The record's progress callback shows when
/// libgit2 begins to write, and is called too.
class CheckoutWatch
{
  public:
    /// @param repository outlives the watch
    /// @param record outlives the watch, which replaces its notification and its progress callback;
    /// the first look sets its baseline
    [[nodiscard]] CheckoutWatch(CheckoutKind kind, git_repository *repository,
                                git_checkout_options &record);
    CheckoutWatch(const CheckoutWatch &) = delete;
    CheckoutWatch &operator=(const CheckoutWatch &) = delete;
    ~CheckoutWatch() = default;

    /// The first look. Call it before the checkout of `target`, a commit, tag or tree.
    /// @throws LibGit2Exception if something is in the way or cannot be examined, and what the
    /// record's own notification throws
    void lookBeforeSwitch(const git_object *target);
    /// As lookBeforeSwitch, for the merge of the commit `theirs` into HEAD.
    void lookBeforeMerge(const git_oid *theirs);

    /// Sets the entries of submodules in the index to those of the target or the merge, and keeps
    /// their folders. Writes the index if something changes. Call it after the checkout or the
    /// merge.
    /// @throws LibGit2Exception, also if the checkout has written files with other attributes than
    /// those of the target
    void settle() const;

    /// Returns true if the watch has refused the checkout at one of its notifications, so that
    /// libgit2 has written nothing.
    bool hasRefused() const noexcept
    {
        return hasRefused_;
    }

  private:
    static int pass(git_checkout_notify_t why, const char *path, const git_diff_file *baseline,
                    const git_diff_file *target, const git_diff_file *workdir,
                    void *payload) noexcept;
    static void passProgress(const char *path, std::size_t completed, std::size_t total,
                             void *payload) noexcept;
    int hear(const CheckoutNotice &notice);
    Finding findMounted(const CheckoutNotice &notice);
    int answer(const Finding &found);
    Finding noteOverwritten(const CheckoutNotice &notice);
    Finding judge(const CheckoutNotice &notice);
    Finding judgeSwitch(WorkingCopy &copy, const TreeChange &change);
    Finding judgeMerge(WorkingCopy &copy, const TreeChange &change, const git_tree *theirs);
    void makeWay(const CheckoutNotice &notice);
    WorkingCopy &lookAtWorkingCopy();
    void noteUntracked(const CheckoutNotice &notice);
    Finding clearAll(const CheckoutNotice &notice);
    void applyAttributes() noexcept;
    void refuse(const Obstacle &obstacle);

    CheckoutKind kind_;
    git_repository *repository_;
    git_checkout_options &record_;
    bool isForced_;
    git_checkout_notify_cb first_;
    void *firstPayload_;
    git_checkout_progress_cb progress_;
    void *progressPayload_;
    PromisedContent promised_;
    std::string root_;
    /// Empty until the first look. A revert needs none.
    std::optional<WorkingCopy> copy_;
    SwitchSubmodules switched_;
    MergeSubmodules merged_;
    /// The record's own value, while a switch keeps submodules.
    OwnedHandle<git_index> baseline_;
    /// Below the root, since the first notification of a revert.
    std::optional<std::vector<std::string>> mounts_;
    bool hasHeard_ = false;
    bool hasRefused_ = false;
    /// What libgit2 itself replaces, according to its last notification with something in that
    /// place.
    std::string replaced_;
    ClearedWay cleared_;
    RemadeFiles remade_;
    NewAttributes attributes_;
    /// What libgit2 cannot be told before it writes.
    std::exception_ptr failure_;
    /// A buffer for what is looked at for each file.
    std::string path_;
};

} // namespace vclink::git
