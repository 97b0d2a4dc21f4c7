// SPDX-License-Identifier: MIT
#pragma once

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

/// While it lives, Ctrl-C asks the back end to stop in place of ending the process: the first one
/// asks on the terminator. Later ones change nothing as long as the back end is heard of. When it
/// has not been for three seconds, or could not be asked, one restores what Ctrl-C does by default,
/// so that the next one ends the process. Where Ctrl-C was ignored before, it stays ignored.
///
/// The signal's handler only writes to a pipe; a thread of its own reads it and asks. No signal is
/// blocked on the thread that works, so that programs started there inherit no blocked signal.
/// At most one object at a time.
class InterruptWatch
{
  public:
    /// @param terminator, activity outlive the watch
    /// @param tellGivenUp called on the watch's own thread when the default was restored, with the
    ///        reason, which is a sentence; it must not throw
    /// @throws std::system_error when the pipe or the thread can't be had
    InterruptWatch(Terminator &terminator, Activity &activity,
                   std::function<void(const std::string &)> tellGivenUp);
    InterruptWatch(const InterruptWatch &) = delete;
    InterruptWatch &operator=(const InterruptWatch &) = delete;
    /// Restores what Ctrl-C did before.
    ~InterruptWatch();

    /// Whether the person asked to stop.
    bool wasAsked() const noexcept;

  private:
    void listen();
    void answer();
    void ask();
    void giveUp(const std::string &reason);

    Terminator &terminator_;
    Activity &activity_;
    std::function<void(const std::string &)> tellGivenUp_;
    std::atomic<bool> asked_{false};
    Pipe pipe_;
    struct sigaction previous_ = {};
    std::thread listener_;
};

} // namespace vclink::shell
