// SPDX-License-Identifier: MIT
#include "options/gitRecords.hpp"

#include "error/errorUtil/gitString.hpp"
#include "options/Callbacks.hpp"

namespace vclink::git
{
namespace
{

/// Sets a field of a record to the function that calls a member function.
template <auto MemberFunctionPointer, class Callback> void setCallback(Callback &field)
{
    field = makeCallback<MemberFunctionPointer, Callback>();
}

} // namespace

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
    setCallback<&CheckoutCallbacks::notifyProgress>(record.notify_cb);
    record.notify_payload = &callbacks;
    setCallback<&CheckoutCallbacks::checkoutProgress>(record.progress_cb);
    record.progress_payload = &callbacks;
    setCallback<&CheckoutCallbacks::perfData>(record.perfdata_cb);
    record.perfdata_payload = &callbacks;
    return record;
}

git_remote_callbacks toGitRemoteCallbacks(RemoteCallbacks &callbacks)
{
    git_remote_callbacks record =
        initGitRecord(git_remote_init_callbacks, unsigned{GIT_REMOTE_CALLBACKS_VERSION});
    record.payload = &callbacks;
    setCallback<&RemoteCallbacks::sidebandProgress>(record.sideband_progress);
    setCallback<&RemoteCallbacks::completion>(record.completion);
    setCallback<&RemoteCallbacks::credentials>(record.credentials);
    setCallback<&RemoteCallbacks::certificateCheck>(record.certificate_check);
    setCallback<&RemoteCallbacks::transferProgress>(record.transfer_progress);
    setCallback<&RemoteCallbacks::updateTips>(record.update_tips);
    setCallback<&RemoteCallbacks::packProgress>(record.pack_progress);
    setCallback<&RemoteCallbacks::pushTransferProgress>(record.push_transfer_progress);
    setCallback<&RemoteCallbacks::pushUpdateReference>(record.push_update_reference);
    setCallback<&RemoteCallbacks::pushNegotiation>(record.push_negotiation);
    return record;
}

git_fetch_options toGitFetchOptions(const FetchOptions &options, GitCallbacks &callbacks)
{
    git_fetch_options record =
        initGitRecord(git_fetch_options_init, unsigned{GIT_FETCH_OPTIONS_VERSION});
    record.proxy_opts = toGitProxyOptions(options.proxyOptions, callbacks.proxyCallbacks());
    record.callbacks = toGitRemoteCallbacks(callbacks.remoteCallbacks());
    return record;
}

git_push_options toGitPushOptions(const PushOptions &options, GitCallbacks &callbacks)
{
    git_push_options record =
        initGitRecord(git_push_options_init, unsigned{GIT_PUSH_OPTIONS_VERSION});
    record.pb_parallelism = options.packbuilderParallelism;
    record.callbacks = toGitRemoteCallbacks(callbacks.remoteCallbacks());
    record.proxy_opts = toGitProxyOptions(options.proxyOptions, callbacks.proxyCallbacks());
    return record;
}

git_clone_options toGitCloneOptions(const CloneOptions &options, GitCallbacks &callbacks)
{
    git_clone_options record =
        initGitRecord(git_clone_options_init, unsigned{GIT_CLONE_OPTIONS_VERSION});
    record.bare = options.bare ? 1 : 0;
    record.checkout_branch =
        options.checkoutBranch ? asGitString(*options.checkoutBranch) : nullptr;
    record.checkout_opts =
        toGitCheckoutOptions(options.checkoutOptions, callbacks.checkoutCallbacks());
    record.fetch_opts = toGitFetchOptions(options.fetchOptions, callbacks);
    return record;
}

} // namespace vclink::git
