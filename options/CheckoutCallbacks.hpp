// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>

#include <git2/checkout.h>

#include "options/CancellationPoller.hpp"
#include "vclink/ApplicationInteractor.hpp"

namespace vclink::git
{

/// The callbacks of a checkout, for cancellation and progress. libgit2 calls the members through
/// the callback bridge.
class CheckoutCallbacks
{
  public:
    /// @param interactor outlives the set
    explicit CheckoutCallbacks(ApplicationInteractor &interactor);

    /// git_checkout_notify_cb. The only poll point of a checkout. Refuses nothing itself.
    /// @return 0
    /// @throws vclink::util::exception::CancelledOperationException
    int notifyProgress(git_checkout_notify_t why, const char *path, const git_diff_file *baseline,
                       const git_diff_file *target, const git_diff_file *workdir);

    /// git_checkout_progress_cb. Updates the host's progress display. Throws what the host's
    /// reporter throws, which the bridge logs and ignores.
    void checkoutProgress(const char *path, std::size_t completedSteps, std::size_t totalSteps);

    /// git_checkout_perfdata_cb. For the log only.
    void perfData(const git_checkout_perfdata *data);

  private:
    ApplicationInteractor &interactor_;
    CancellationPoller poller_;
};

} // namespace vclink::git
