// SPDX-License-Identifier: MIT
#pragma once

#include "vclink/ApplicationInteractor.hpp"
#include "vclink/PollableTerminator.hpp"

namespace vclink::git
{

/// Sees the host's requests for cancellation. Each poller has a memory of its own: a request that
/// one has taken is still there for another.
class CancellationPoller
{
  public:
    /// Connects to the interactor's source, from now until the end of the object.
    /// @param interactor outlives the poller
    explicit CancellationPoller(ApplicationInteractor &interactor);

    /// @throws vclink::util::exception::CancelledOperationException when cancellation was asked for
    /// since the last call; the request is forgotten then
    void throwIfCancelled();

  private:
    [[maybe_unused]] ApplicationInteractor &interactor_;
    PollableTerminator terminator_;
};

} // namespace vclink::git
