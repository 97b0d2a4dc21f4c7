// SPDX-License-Identifier: MIT
#pragma once

#include <csignal>

namespace vclink::git
{

/// Keeps the calling thread from the signal of a broken connection, which libgit2's sockets do not
/// suppress and which ends a process that has not provided for it: a write to a connection that the
/// other side has reset fails as any other write does then. What the process does about the signal
/// is left to the host. Blocks nest.
///
/// Lives on the stack, around all use of a remote and the release of its handle. A child that is
/// started meanwhile begins with the signal blocked.
class SigpipeBlock
{
  public:
    [[nodiscard]] SigpipeBlock() noexcept;
    SigpipeBlock(const SigpipeBlock &) = delete;
    SigpipeBlock &operator=(const SigpipeBlock &) = delete;
    /// Takes a signal away that came in between, one that was pending before staying, and gives the
    /// thread its mask back. errno stays as it is.
    ~SigpipeBlock();

  private:
    sigset_t maskBefore_;
    bool wasPending_;
};

} // namespace vclink::git
