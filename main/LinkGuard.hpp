// SPDX-License-Identifier: MIT
#pragma once

#include <git2/checkout.h>

namespace vclink::git
{

/// Keeps a checkout from going through symbolic links. libgit2 1.5 takes a link that stands where a
/// file or a folder belongs for the thing itself, and writes and deletes in whatever it leads to,
/// inside the working copy or outside. What is done about a link in the way depends on the
/// checkout: ForceLinkGuard removes it, SafeLinkGuard refuses.
///
/// Hears of each file before the first is written, through the record's notifications, which go to
/// the callback that the record had first.
class LinkGuard
{
  public:
    LinkGuard(const LinkGuard &) = delete;
    LinkGuard &operator=(const LinkGuard &) = delete;

  protected:
    /// @param record its notification is taken over; goes into the checkout while the guard lives
    explicit LinkGuard(git_checkout_options &record);
    ~LinkGuard() = default;

  private:
    /// git_checkout_notify_cb, of a file that the record's own callback has let pass.
    virtual int notify(git_checkout_notify_t why, const char *path, const git_diff_file *baseline,
                       const git_diff_file *target, const git_diff_file *workdir) = 0;
    static int pass(git_checkout_notify_t why, const char *path, const git_diff_file *baseline,
                    const git_diff_file *target, const git_diff_file *workdir,
                    void *payload) noexcept;

    git_checkout_notify_cb first_;
    void *firstPayload_;
};

} // namespace vclink::git
