// SPDX-License-Identifier: MIT
#pragma once

#include "options/CancellationPoller.hpp"
#include "vclink/ApplicationInteractor.hpp"

namespace vclink::git
{

/// What libgit2 talks to during a checkout.
class CheckoutCallbacks
{
  public:
    /// @param interactor outlives the set
    explicit CheckoutCallbacks(ApplicationInteractor &interactor);

  private:
    [[maybe_unused]] ApplicationInteractor &interactor_;
    CancellationPoller poller_;
};

} // namespace vclink::git
