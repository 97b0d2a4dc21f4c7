// SPDX-License-Identifier: MIT
#pragma once

#include "options/CancellationPoller.hpp"
#include "vclink/ApplicationInteractor.hpp"

namespace vclink::git
{

/// What libgit2 talks to while it talks to a remote.
class RemoteCallbacks
{
  public:
    /// @param interactor outlives the set
    explicit RemoteCallbacks(ApplicationInteractor &interactor);

  private:
    [[maybe_unused]] ApplicationInteractor &interactor_;
    CancellationPoller poller_;
};

} // namespace vclink::git
