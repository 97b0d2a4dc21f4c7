// SPDX-License-Identifier: MIT
#pragma once

#include <git2/checkout.h>
#include <git2/clone.h>
#include <git2/types.h>

namespace vclink::git
{

/// Watches the checkout of one clone, so that each file is written with the attributes of the
/// commit. libgit2 knows those of a `.gitattributes` only after it has written it, and the files
/// that come before it in path order would lack them. Refuses settings that libgit2 cannot read.
///
/// Needs no other rules: libgit2 clones only into a new or an empty folder. Calls the record's own
/// notification first.
class CloneWatch
{
  public:
    /// @param record outlives the watch, which replaces the notification of its checkout and the
    /// creation of its repository and remote
    explicit CloneWatch(git_clone_options &record);
    CloneWatch(const CloneWatch &) = delete;
    CloneWatch &operator=(const CloneWatch &) = delete;
    ~CloneWatch() = default;

  private:
    static int create(git_repository **repository, const char *path, int isBare,
                      void *payload) noexcept;
    static int createRemote(git_remote **remote, git_repository *repository, const char *name,
                            const char *url, void *payload) noexcept;
    static int pass(git_checkout_notify_t why, const char *path, const git_diff_file *baseline,
                    const git_diff_file *target, const git_diff_file *workdir,
                    void *payload) noexcept;

    git_checkout_notify_cb first_;
    void *firstPayload_;
    /// Owned by the clone.
    git_repository *repository_ = nullptr;
};

} // namespace vclink::git
