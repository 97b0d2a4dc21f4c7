// SPDX-License-Identifier: MIT
#pragma once

#include <memory>

#include "vclink/Terminator.hpp"
#include "vclink_host/export.hpp"

namespace vclink
{

/// Remembers a request for cancellation until it is polled. Each object has a memory of its own. A
/// request made on another thread is seen by the next poll.
class VCLINK_HOST_EXPORT PollableTerminator
{
  public:
    /// Attaches to the source. An object may outlive its source, and is not told of anything then.
    explicit PollableTerminator(Terminator &source);
    PollableTerminator(const PollableTerminator &) = delete;
    PollableTerminator &operator=(const PollableTerminator &) = delete;
    ~PollableTerminator();

    /// Whether cancellation was asked for since the last poll; clears that state.
    bool checkAndResetCancelledState() noexcept;

  private:
    struct Impl;
    std::unique_ptr<Impl> impl_;
};

} // namespace vclink
