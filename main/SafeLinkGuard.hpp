// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include <git2/checkout.h>
#include <git2/types.h>

namespace vclink::git
{

/// Keeps a safe checkout of a commit from going through symbolic links: libgit2 1.5 takes an
/// untracked link that stands where a tracked folder belongs for the folder, and writes and deletes
/// in whatever it leads to, inside the working copy or outside; through an ignored link that stands
/// where a file belongs it writes into another file. git refuses the former, and this refuses both.
///
/// Hears of each file and link before the first is written, through the record's notifications,
/// which go on to the callback that the record had. A link above files that the checkout does not
/// touch is no obstacle.
class SafeLinkGuard
{
  public:
    /// @param target what is checked out; outlives the guard
    /// @param record its notification is taken over; goes into the checkout while the guard lives,
    /// which fails with GIT_ECONFLICT where a link is in the way
    SafeLinkGuard(git_repository *repository, const git_object *target,
                  git_checkout_options &record);
    SafeLinkGuard(const SafeLinkGuard &) = delete;
    SafeLinkGuard &operator=(const SafeLinkGuard &) = delete;

  private:
    static int notify(git_checkout_notify_t why, const char *path, const git_diff_file *baseline,
                      const git_diff_file *target, const git_diff_file *workdir,
                      void *payload) noexcept;
    bool isChangedFolder(const std::string &name) const;

    git_repository *repository_;
    std::string target_;
    git_checkout_notify_cb next_;
    void *nextPayload_;
};

} // namespace vclink::git
