// SPDX-License-Identifier: MIT
#include "options/gitRecords.hpp"

#include "error/notAvailable.hpp"

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

git_checkout_options toGitCheckoutOptions(const CheckoutOptions & /*options*/,
                                          CheckoutCallbacks & /*callbacks*/)
{
    raiseNotAvailable();
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
