// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <utility>
#include <vector>

#include <git2/checkout.h>

namespace vclink::git
{

/// Keeps a checkout by force from writing through symbolic links: libgit2 1.5 takes a link that
/// stands where a file belongs, or a folder above it, for the thing itself, and writes into
/// whatever it leads to, inside the working copy or outside. git removes such a link, and so does
/// this.
///
/// Hears of each file before the first is written, through the record's notifications, which go on
/// to the callback that the record had. At its end it puts the links back into whose place nothing
/// has come, which are those of a checkout that failed or was cancelled.
class LinkGuard
{
  public:
    /// @param record its notification is taken over; goes into the checkout while the guard lives
    LinkGuard(git_repository *repository, git_checkout_options &record);
    LinkGuard(const LinkGuard &) = delete;
    LinkGuard &operator=(const LinkGuard &) = delete;
    ~LinkGuard();

  private:
    static int notify(git_checkout_notify_t why, const char *path, const git_diff_file *baseline,
                      const git_diff_file *target, const git_diff_file *workdir,
                      void *payload) noexcept;
    void clearTheWay(const std::string &name);
    void removeLink(const std::string &path);

    std::string workdir_;
    git_checkout_notify_cb next_;
    void *nextPayload_;
    /// What was removed: path and target.
    std::vector<std::pair<std::string, std::string>> removed_;
};

} // namespace vclink::git
