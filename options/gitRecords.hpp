// SPDX-License-Identifier: MIT
#pragma once

#include <git2/checkout.h>
#include <git2/clone.h>
#include <git2/merge.h>
#include <git2/proxy.h>
#include <git2/remote.h>

#include "error/errorUtil/GitResult.hpp"
#include "options/GitCallbacks.hpp"
#include "vclink/git/CheckoutOptions.hpp"
#include "vclink/git/CloneOptions.hpp"
#include "vclink/git/FetchOptions.hpp"
#include "vclink/git/MergeOptions.hpp"
#include "vclink/git/ProxyOptions.hpp"
#include "vclink/git/PushOptions.hpp"

/// Converts an option value and a callback set to a record of libgit2, right before the call that
/// needs it. A record owns no memory: the value's strings and the callback set must outlive the
/// call. Each function throws what GitErrorPolicy throws if libgit2 refuses to initialise the
/// record.
namespace vclink::git
{

/// Returns a record that libgit2 has initialised.
/// @throws LibGit2Exception if `init` fails
template <class Record, class Version>
Record initGitRecord(int (*init)(Record *, Version), Version version)
{
    Record record{};
    check(makeResult(init(&record, version)));
    return record;
}

/// git_proxy_options_init. Ignores both arguments; no proxy is used.
git_proxy_options toGitProxyOptions(const ProxyOptions &options, ProxyCallbacks &callbacks);

/// git_merge_options_init. Ignores the value.
git_merge_options toGitMergeOptions(const MergeOptions &options);

/// git_checkout_options_init. Sets the strategy's low 32 bits, all notifications, and the three
/// callbacks with `callbacks` as their payload. The rest stays as libgit2 initialised it; the
/// caller sets a list of paths.
git_checkout_options toGitCheckoutOptions(const CheckoutOptions &options,
                                          CheckoutCallbacks &callbacks);

/// git_remote_init_callbacks. Sets all ten callbacks of RemoteCallbacks, with `callbacks` as their
/// payload. The rest stays as libgit2 initialised it.
git_remote_callbacks toGitRemoteCallbacks(RemoteCallbacks &callbacks);

/// git_fetch_options_init. Sets the proxy record and the remote callbacks. The rest stays as
/// libgit2 initialised it: tags and pruning are as configured for the remote.
git_fetch_options toGitFetchOptions(const FetchOptions &options, GitCallbacks &callbacks);

/// git_push_options_init. Sets the number of threads, the remote callbacks and the proxy record.
/// The rest stays as libgit2 initialised it.
git_push_options toGitPushOptions(const PushOptions &options, GitCallbacks &callbacks);

/// git_clone_options_init. Sets what `options` has, with the records of its checkout and of its
/// fetch. The rest stays as libgit2 initialised it.
/// @param options the record points to its branch name, if it has one
git_clone_options toGitCloneOptions(const CloneOptions &options, GitCallbacks &callbacks);

} // namespace vclink::git
