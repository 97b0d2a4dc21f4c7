// SPDX-License-Identifier: MIT
#pragma once

#include <atomic>
#include <chrono>

namespace vclink::shell
{

/// When an operation was last heard of. Noted on one thread, read on another.
class Activity
{
  public:
    using Clock = std::chrono::steady_clock;
    using Now = Clock::time_point (*)();

    explicit Activity(Now now = &Clock::now) : now_(now), last_(read())
    {
    }

    void note() noexcept
    {
        last_.store(read());
    }
    /// How long ago that was.
    Clock::duration quiet() const noexcept
    {
        return Clock::duration(read() - last_.load());
    }

  private:
    Clock::rep read() const noexcept
    {
        return now_().time_since_epoch().count();
    }

    Now now_;
    std::atomic<Clock::rep> last_;
};

} // namespace vclink::shell
