// SPDX-License-Identifier: MIT
#pragma once

#include <optional>
#include <set>

#include <sys/types.h>

namespace vclink::git
{

/// Clears away at its end what Boost.Process leaves behind when a run does not come to its own end:
/// of a command that can't be started, the writing end of its output pipe and the child that could
/// not become the command; of a command that was killed, the child that nobody has waited for. To
/// be made right before the start, and to end after the child's own object. Children of the process
/// that are none of its own are never waited for.
class FailedStartCleanup
{
  public:
    /// @param source, sink the pipe's two ends, open
    /// @throws std::bad_alloc
    [[nodiscard]] FailedStartCleanup(int source, int sink);
    FailedStartCleanup(const FailedStartCleanup &) = delete;
    FailedStartCleanup &operator=(const FailedStartCleanup &) = delete;
    ~FailedStartCleanup();

    /// From now on the child is the one to wait for, and the pipe is not touched.
    void hasStarted(pid_t child) noexcept
    {
        child_ = child;
    }
    /// From now on nothing is left to do.
    void hasEnded() noexcept
    {
        ended_ = true;
    }

  private:
    void closeSink() const noexcept;
    void reapFailedChild() const;

    int source_;
    int sink_;
    std::optional<std::set<pid_t>> childrenBefore_;
    pid_t child_ = 0;
    bool ended_ = false;
};

} // namespace vclink::git
