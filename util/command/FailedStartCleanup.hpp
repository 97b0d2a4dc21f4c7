// SPDX-License-Identifier: MIT
#pragma once

#include <optional>
#include <set>

#include <sys/types.h>

namespace vclink::git
{

/// Removes at its end what Boost.Process leaves if a run fails: for a command that cannot be
/// started, the writing end of its output pipe and the child that could not become the command; for
/// a command that was killed, the child that nobody has waited for. Create it right before the
/// start, and destroy it after the child's own object. It never waits for other children of the
/// process.
class FailedStartCleanup
{
  public:
    /// @param source, sink the pipe's two ends, open
    /// @throws std::bad_alloc
    [[nodiscard]] FailedStartCleanup(int source, int sink);
    FailedStartCleanup(const FailedStartCleanup &) = delete;
    FailedStartCleanup &operator=(const FailedStartCleanup &) = delete;
    ~FailedStartCleanup();

    /// After this call the object waits for this child, and does not touch the pipe.
    void hasStarted(pid_t child) noexcept
    {
        child_ = child;
    }
    /// After this call the object does nothing at its end.
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
