// SPDX-License-Identifier: MIT
#pragma once

#include <system_error>

#include <sys/types.h>

namespace vclink::git
{

/// Whether the system keeps the status of a child that ends. It does not while the process ignores
/// SIGCHLD.
[[nodiscard]] bool isChildStatusKept() noexcept;

/// Learns how a child ended, and leaves it for its owner to wait for. A status that somebody else
/// in the process has taken is an error, and never looks like success.
class ChildStatus
{
  public:
    explicit ChildStatus(pid_t child) noexcept : child_(child)
    {
    }

    /// Whether the child runs. Does not wait.
    /// @param error set when the status can't be known; the child does not run then
    bool isRunning(std::error_code &error) noexcept;

    /// Waits for the child's end.
    /// @param error set when the status can't be known; the result means nothing then
    /// @return the child's exit status, or the number of the signal that ended it
    int wait(std::error_code &error) noexcept;

  private:
    void look(int options, std::error_code &error) noexcept;

    pid_t child_;
    bool ended_ = false;
    int status_ = -1;
};

} // namespace vclink::git
