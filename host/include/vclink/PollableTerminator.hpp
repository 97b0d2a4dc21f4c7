// SPDX-License-Identifier: MIT
#pragma once

#include <memory>

#include "vclink/Terminator.hpp"
#include "vclink_host/export.hpp"

namespace vclink
{

/// Remembers a cancellation request until it is polled. Each object remembers it separately. The
/// next poll sees a request of another thread.
class VCLINK_HOST_EXPORT PollableTerminator
{
  public:
    /// Attaches to the source. An object can outlive its source, and then receives nothing.
    explicit PollableTerminator(Terminator &source);
    PollableTerminator(const PollableTerminator &) = delete;
    PollableTerminator &operator=(const PollableTerminator &) = delete;
    ~PollableTerminator();

    /// Returns true if cancellation was requested since the last poll, and clears the request.
    bool checkAndResetCancelledState() noexcept;

  private:
    struct Impl;
    std::unique_ptr<Impl> impl_;
};

} // namespace vclink
