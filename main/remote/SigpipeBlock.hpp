// SPDX-License-Identifier: MIT
#pragma once

#include <csignal>

namespace vclink::git
{

/// Blocks SIGPIPE, the signal of a broken connection, for the calling thread. libgit2's sockets do
/// not suppress it, and by default it ends the process. With the block, a write to a connection
/// that the other side has reset fails like any other write. Does not change how the process
/// handles the signal. Blocks nest.
///
/// Lives on the stack, around every use of a remote and the release of its handle. A child process
/// that is started in between begins with the signal blocked.
class SigpipeBlock
{
  public:
    [[nodiscard]] SigpipeBlock() noexcept;
    SigpipeBlock(const SigpipeBlock &) = delete;
    SigpipeBlock &operator=(const SigpipeBlock &) = delete;
    /// Removes a signal that came in between, but not one that was pending before. Restores the
    /// thread's mask, and keeps errno.
    ~SigpipeBlock();

  private:
    sigset_t maskBefore_;
    bool wasPending_;
};

} // namespace vclink::git
