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

/// Conversions of an option value and a callback set to the record that libgit2 takes, made right
/// before the call that needs it. A record holds no memory of its own; what it points at, the
/// value's strings and the callback set, must outlive the call. Each raises what GitErrorPolicy
/// raises when libgit2 refuses to initialise the record.
namespace vclink::git
{

/// A record zeroed and initialised by libgit2.
/// @throws LibGit2Exception when `init` fails
template <class Record, class Version>
Record initGitRecord(int (*init)(Record *, Version), Version version)
{
    Record record{};
    check(makeResult(init(&record, version)));
    return record;
}

/// git_proxy_options_init; neither argument is read, and no proxy is used.
git_proxy_options toGitProxyOptions(const ProxyOptions &options, ProxyCallbacks &callbacks);

/// git_merge_options_init; nothing of the value is read.
git_merge_options toGitMergeOptions(const MergeOptions &options);

/// git_checkout_options_init. The strategy's low 32 bits, all notifications, and the three
/// callbacks with `callbacks` as their payload; the rest stays as libgit2 initialised it. A list of
/// paths is the caller's to fill in.
git_checkout_options toGitCheckoutOptions(const CheckoutOptions &options,
                                          CheckoutCallbacks &callbacks);

/// git_remote_init_callbacks. All ten callbacks of RemoteCallbacks, with `callbacks` as their
/// payload; the rest stays as libgit2 initialised it.
git_remote_callbacks toGitRemoteCallbacks(RemoteCallbacks &callbacks);

/// git_fetch_options_init. The proxy record and the remote callbacks; the rest stays as libgit2
/// initialised it: tags come along with what they point at, nothing is pruned.
git_fetch_options toGitFetchOptions(const FetchOptions &options, GitCallbacks &callbacks);

/// git_push_options_init. The number of threads, the remote callbacks and the proxy record; the
/// rest stays as libgit2 initialised it.
git_push_options toGitPushOptions(const PushOptions &options, GitCallbacks &callbacks);

/// git_clone_options_init. What `options` says, with the records of its checkout and of its fetch;
/// the rest stays as libgit2 initialised it.
/// @param options the record points at its branch name, where it has one
git_clone_options toGitCloneOptions(const CloneOptions &options, GitCallbacks &callbacks);

} // namespace vclink::git
