// SPDX-License-Identifier: MIT
#pragma once

#include "vclink/ApplicationInteractor.hpp"
#include "vclink/PollableTerminator.hpp"

namespace vclink::git
{

/// Reads the host's cancellation requests. Each poller remembers requests separately: a request
/// that one has read is still there for another.
class CancellationPoller
{
  public:
    /// Connects to the interactor's source until the end of the object.
    /// @param interactor outlives the poller
    explicit CancellationPoller(ApplicationInteractor &interactor);

    /// @throws vclink::util::exception::CancelledOperationException if cancellation was requested
    /// since the last call; then the request is forgotten
    void throwIfCancelled();

  private:
    [[maybe_unused]] ApplicationInteractor &interactor_;
    PollableTerminator terminator_;
};

} // namespace vclink::git
