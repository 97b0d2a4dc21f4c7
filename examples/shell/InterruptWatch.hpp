// SPDX-License-Identifier: MIT
#pragma once

#include <array>
#include <atomic>
#include <csignal>
#include <functional>
#include <string>
#include <thread>

#include "Activity.hpp"
#include "Pipe.hpp"
#include "vclink/Terminator.hpp"

namespace vclink::shell
{

/// While it lives, SIGINT (Ctrl-C), SIGTERM and SIGHUP ask the back end to stop instead of ending
/// the process: the first one asks on the terminator. Later ones have no effect while the back end
/// reports something. If it has reported nothing for three seconds, or could not be asked, a signal
/// restores the defaults, so that the one after it ends the process. A signal that was ignored
/// before stays ignored.
///
/// The signals' handler only writes to a pipe; a thread of its own reads it and asks. No signal is
/// blocked on the thread that works, so that programs started there inherit no blocked signal.
/// At most one object at a time.
class InterruptWatch
{
  public:
    /// @param terminator, activity outlive the watch
    /// @param tellGivenUp called on the watch's own thread when the defaults were restored, with
    ///        the reason, which is a sentence; it must not throw
    /// @param tellAsked called on the watch's own thread when the first signal has come; it must
    /// not
    ///        throw
    /// @throws std::system_error when the pipe or the thread can't be had
    InterruptWatch(
        Terminator &terminator, Activity &activity,
        std::function<void(const std::string &)> tellGivenUp,
        std::function<void()> tellAsked = [] {});
    InterruptWatch(const InterruptWatch &) = delete;
    InterruptWatch &operator=(const InterruptWatch &) = delete;
    /// As end().
    ~InterruptWatch();

    /// Answers what has come, and restores what the signals did before. askedBy() is final then.
    void end() noexcept;
    /// The signal that asked to stop, or 0. Of several, the last one that is not Ctrl-C: whoever
    /// sent it expects the process to end.
    int askedBy() const noexcept;

  private:
    static constexpr std::array<int, 3> signals{SIGINT, SIGTERM, SIGHUP};

    /// Sets the action of the signals that were not ignored.
    void take(const struct sigaction &action) noexcept;
    void restore() noexcept;
    void listen();
    void answer(int signal);
    void ask();
    void giveUp(const std::string &reason);

    Terminator &terminator_;
    Activity &activity_;
    std::function<void(const std::string &)> tellGivenUp_;
    std::function<void()> tellAsked_;
    std::atomic<int> askedBy_{0};
    Pipe pipe_;
    std::array<struct sigaction, signals.size()> previous_{};
    std::thread listener_;
};

} // namespace vclink::shell
