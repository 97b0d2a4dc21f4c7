// SPDX-License-Identifier: MIT
#include "main/checkout/CloneWatch.hpp"

#include <git2/remote.h>
#include <git2/repository.h>

#include "error/errorUtil/GitResult.hpp"
#include "error/errorUtil/OwnedHandle.hpp"
#include "error/errorUtil/callbackException.hpp"
#include "main/checkout/NewAttributes.hpp"
#include "util/repository/repository.hpp"
#include "util/repository/settings.hpp"

namespace vclink::git
{

CloneWatch::CloneWatch(git_clone_options &record)
    : first_(record.checkout_opts.notify_cb), firstPayload_(record.checkout_opts.notify_payload)
{
    record.repository_cb = create;
    record.repository_cb_payload = this;
    record.remote_cb = createRemote;
    record.checkout_opts.notify_cb = pass;
    record.checkout_opts.notify_payload = this;
}

/// As libgit2 does it. It does not give the repository to the checkout's notification.
int CloneWatch::create(git_repository **repository, const char *path, int isBare,
                       void *payload) noexcept
{
    auto &watch = *static_cast<CloneWatch *>(payload);
    git_repository *created = nullptr;
    const int code = git_repository_init(&created, path, static_cast<unsigned>(isBare));
    OwnedHandle<git_repository> owned(created);
    if (code == 0)
    {
        watch.repository_ = created;
        *repository = owned.release();
    }
    return code;
}

/// As libgit2 does it, which removes the repository if this fails.
int CloneWatch::createRemote(git_remote **remote, git_repository *repository, const char *name,
                             const char *url, void * /*payload*/) noexcept
{
    try
    {
        refuseUnreadableSettings(repository);
        *remote = acquire<git_remote>(git_remote_create, repository, name, url).value().release();
        return 0;
    }
    catch (...)
    {
        return parkCallbackException();
    }
}

int CloneWatch::pass(git_checkout_notify_t why, const char *path, const git_diff_file *baseline,
                     const git_diff_file *target, const git_diff_file *workdir,
                     void *payload) noexcept
{
    const auto &watch = *static_cast<CloneWatch *>(payload);
    const int code = watch.first_(why, path, baseline, target, workdir, watch.firstPayload_);
    const bool makesAttributes = code == 0 && why == GIT_CHECKOUT_NOTIFY_UPDATED &&
                                 target != nullptr && isAttributesFile(path) && isWritten(*target);
    if (!makesAttributes)
    {
        return code;
    }
    try
    {
        setAttributes(getRepositoryIndex(watch.repository_).get(), path, *target);
        return 0;
    }
    catch (...)
    {
        return parkCallbackException();
    }
}

} // namespace vclink::git
