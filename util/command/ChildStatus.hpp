// SPDX-License-Identifier: MIT
#pragma once

#include <system_error>

#include <sys/types.h>

namespace vclink::git
{

/// Returns true if the system keeps the status of a child that ends. It does not if the process
/// ignores SIGCHLD.
[[nodiscard]] bool isChildStatusKept() noexcept;

/// Finds out how a child ended, and leaves the child for its owner to wait for. If another part of
/// the process has read the status, that is an error, never a success.
class ChildStatus
{
  public:
    explicit ChildStatus(pid_t child) noexcept : child_(child)
    {
    }

    /// Returns true if the child runs. Does not wait.
    /// @param error set if the status is unknown; then the child does not run
    bool isRunning(std::error_code &error) noexcept;

    /// Waits for the end of the child.
    /// @param error set if the status is unknown; then the result has no meaning
    /// @return the child's exit status, or the number of the signal that ended it
    int wait(std::error_code &error) noexcept;

  private:
    void look(int options, std::error_code &error) noexcept;

    pid_t child_;
    bool ended_ = false;
    int status_ = -1;
};

} // namespace vclink::git
