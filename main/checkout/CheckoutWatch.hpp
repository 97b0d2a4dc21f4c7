// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>
#include <optional>
#include <string>

#include <git2/checkout.h>
#include <git2/types.h>

#include "error/errorUtil/OwnedHandle.hpp"
#include "main/checkout/ClearedWay.hpp"
#include "main/checkout/HardLinks.hpp"
#include "main/checkout/MergeSubmodules.hpp"
#include "main/checkout/Obstacle.hpp"
#include "main/checkout/SwitchSubmodules.hpp"
#include "main/checkout/WorkingCopy.hpp"
#include "main/checkout/noticedObstacles.hpp"

namespace vclink::git
{

enum class CheckoutKind
{
    /// A switch or a fast-forward, under the strategy GIT_CHECKOUT_SAFE.
    Switch,
    /// A merge, by force.
    Merge,
    /// A revert, by force, of what the user lists.
    Revert
};

/// Watches over one checkout: nothing is lost that Git cannot give back, and nothing is written
/// through a link or waits for a FIFO. libgit2 tells of most files before it writes the first, and
/// what it does not tell of is looked at before.
///
/// A switch and a merge are refused with GIT_ECONFLICT, class GIT_ERROR_CHECKOUT and a text that
/// names the first file; nothing is written then. A revert clears the way, as git does: it replaces
/// the links, FIFOs, sockets and devices that are in it.
///
/// A switch and a merge are also refused, with GIT_EMODIFIED, if HEAD has moved since the look
/// before. If it moves after that, what is written is still what HEAD then was, so that files of
/// the new commit are not deleted.
///
/// The record's own notification is asked first, so that a cancellation comes before a refusal; it
/// is told of what is refused as of any other conflict. The record's progress tells when libgit2
/// begins to write, and is handed on.
class CheckoutWatch
{
  public:
    /// @param repository outlives the watch
    /// @param record outlives the watch; its notification and its progress are taken over, and its
    /// baseline set by the look before
    [[nodiscard]] CheckoutWatch(CheckoutKind kind, git_repository *repository,
                                git_checkout_options &record);
    CheckoutWatch(const CheckoutWatch &) = delete;
    CheckoutWatch &operator=(const CheckoutWatch &) = delete;
    ~CheckoutWatch() = default;

    /// To be called before the checkout of `target`, a commit, tag or tree.
    /// @throws LibGit2Exception if something is in the way or cannot be examined, and what the
    /// record's own notification raises
    void lookBeforeSwitch(const git_object *target);
    /// As lookBeforeSwitch, before the commit `theirs` is merged into HEAD.
    void lookBeforeMerge(const git_oid *theirs);

    /// To be called after the checkout or the merge that was looked at before: the entries of
    /// submodules in the index become what the target or the merge has, while their folders stay.
    /// Writes the index if there is anything to change.
    /// @throws LibGit2Exception
    void settleSubmodules() const;

  private:
    static int pass(git_checkout_notify_t why, const char *path, const git_diff_file *baseline,
                    const git_diff_file *target, const git_diff_file *workdir,
                    void *payload) noexcept;
    static void passProgress(const char *path, std::size_t completed, std::size_t total,
                             void *payload) noexcept;
    int hear(const CheckoutNotice &notice);
    Finding noteHardLink(const CheckoutNotice &notice);
    Finding judge(const CheckoutNotice &notice);
    void makeWay(const CheckoutNotice &notice);
    WorkingCopy &lookAtWorkingCopy();
    void noteUntracked(const CheckoutNotice &notice);
    Finding clearAll(const CheckoutNotice &notice);
    void refuse(const Obstacle &obstacle);

    CheckoutKind kind_;
    git_repository *repository_;
    git_checkout_options &record_;
    bool isForced_;
    git_checkout_notify_cb first_;
    void *firstPayload_;
    git_checkout_progress_cb progress_;
    void *progressPayload_;
    std::string root_;
    /// Empty until the look before; a revert needs none.
    std::optional<WorkingCopy> copy_;
    SwitchSubmodules switched_;
    MergeSubmodules merged_;
    /// The record's, while a switch keeps submodules.
    OwnedHandle<git_index> baseline_;
    bool hasHeard_ = false;
    /// What libgit2 itself replaces, as the last notification with something there has told.
    std::string replaced_;
    ClearedWay cleared_;
    HardLinks hardLinks_;
};

} // namespace vclink::git
