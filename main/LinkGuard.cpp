// SPDX-License-Identifier: MIT
#include "main/LinkGuard.hpp"

#include <fcntl.h>

#include "error/errorUtil/callbackException.hpp"

namespace vclink::git
{

LinkGuard::LinkGuard(git_checkout_options &record)
    : first_(record.notify_cb), firstPayload_(record.notify_payload)
{
    record.notify_cb = pass;
    record.notify_payload = this;
    // A link that comes later must not be written through either.
    record.file_open_flags = O_CREAT | O_TRUNC | O_WRONLY | O_NOFOLLOW;
}

int LinkGuard::pass(git_checkout_notify_t why, const char *path, const git_diff_file *baseline,
                    const git_diff_file *target, const git_diff_file *workdir,
                    void *payload) noexcept
{
    auto &guard = *static_cast<LinkGuard *>(payload);
    const int code = guard.first_(why, path, baseline, target, workdir, guard.firstPayload_);
    if (code != 0)
    {
        return code;
    }
    try
    {
        return guard.notify(why, path, baseline, target, workdir);
    }
    catch (...)
    {
        return parkCallbackException();
    }
}

} // namespace vclink::git
