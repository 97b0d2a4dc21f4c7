// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>

#include <git2/checkout.h>

#include "options/CancellationPoller.hpp"
#include "vclink/ApplicationInteractor.hpp"

namespace vclink::git
{

/// What libgit2 talks to during a checkout: cancellation and progress. Its members are reached
/// through the callback bridge.
class CheckoutCallbacks
{
  public:
    /// @param interactor outlives the set
    explicit CheckoutCallbacks(ApplicationInteractor &interactor);

    /// git_checkout_notify_cb. The one poll point of a checkout; vetoes nothing by itself.
    /// @return 0
    /// @throws vclink::util::exception::CancelledOperationException
    int notifyProgress(git_checkout_notify_t why, const char *path, const git_diff_file *baseline,
                       const git_diff_file *target, const git_diff_file *workdir);

    /// git_checkout_progress_cb. Moves the host's progress display. Raises what the host's reporter
    /// raises, which the bridge reports to the log and drops.
    void checkoutProgress(const char *path, std::size_t completedSteps, std::size_t totalSteps);

    /// git_checkout_perfdata_cb. For the log only.
    void perfData(const git_checkout_perfdata *data);

  private:
    ApplicationInteractor &interactor_;
    CancellationPoller poller_;
};

} // namespace vclink::git
