// SPDX-License-Identifier: MIT
#include "options/gitRecords.hpp"

#include "error/notAvailable.hpp"
#include "options/Callbacks.hpp"

namespace vclink::git
{

git_proxy_options toGitProxyOptions(const ProxyOptions & /*options*/,
                                    ProxyCallbacks & /*callbacks*/)
{
    return initGitRecord(git_proxy_options_init, unsigned{GIT_PROXY_OPTIONS_VERSION});
}

git_merge_options toGitMergeOptions(const MergeOptions & /*options*/)
{
    return initGitRecord(git_merge_options_init, unsigned{GIT_MERGE_OPTIONS_VERSION});
}

git_checkout_options toGitCheckoutOptions(const CheckoutOptions &options,
                                          CheckoutCallbacks &callbacks)
{
    git_checkout_options record =
        initGitRecord(git_checkout_options_init, unsigned{GIT_CHECKOUT_OPTIONS_VERSION});
    record.checkout_strategy = static_cast<unsigned>(options.checkoutStrategy);
    record.notify_flags = GIT_CHECKOUT_NOTIFY_ALL;
    record.notify_cb = makeCallback<&CheckoutCallbacks::notifyProgress, git_checkout_notify_cb>();
    record.notify_payload = &callbacks;
    record.progress_cb =
        makeCallback<&CheckoutCallbacks::checkoutProgress, git_checkout_progress_cb>();
    record.progress_payload = &callbacks;
    record.perfdata_cb = makeCallback<&CheckoutCallbacks::perfData, git_checkout_perfdata_cb>();
    record.perfdata_payload = &callbacks;
    return record;
}

git_remote_callbacks toGitRemoteCallbacks(RemoteCallbacks & /*callbacks*/)
{
    raiseNotAvailable();
}

git_fetch_options toGitFetchOptions(const FetchOptions & /*options*/, GitCallbacks & /*callbacks*/)
{
    raiseNotAvailable();
}

git_push_options toGitPushOptions(const PushOptions & /*options*/, GitCallbacks & /*callbacks*/)
{
    raiseNotAvailable();
}

git_clone_options toGitCloneOptions(const CloneOptions & /*options*/, GitCallbacks & /*callbacks*/)
{
    raiseNotAvailable();
}

} // namespace vclink::git
