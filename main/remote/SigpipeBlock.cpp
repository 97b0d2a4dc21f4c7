// SPDX-License-Identifier: MIT
#include "main/remote/SigpipeBlock.hpp"

#include <cerrno>
#include <ctime>

namespace vclink::git
{
namespace
{

sigset_t makeSigpipeSet() noexcept
{
    sigset_t signals;
    sigemptyset(&signals);
    sigaddset(&signals, SIGPIPE);
    return signals;
}

bool isSigpipePending() noexcept
{
    sigset_t pending;
    sigemptyset(&pending);
    sigpending(&pending);
    return sigismember(&pending, SIGPIPE) == 1;
}

void consumeSigpipe() noexcept
{
    const sigset_t signals = makeSigpipeSet();
    const timespec atOnce = {};
    while (sigtimedwait(&signals, nullptr, &atOnce) < 0 && errno == EINTR)
    {
    }
}

} // namespace

SigpipeBlock::SigpipeBlock() noexcept : maskBefore_(), wasPending_(isSigpipePending())
{
    const sigset_t signals = makeSigpipeSet();
    pthread_sigmask(SIG_BLOCK, &signals, &maskBefore_);
}

SigpipeBlock::~SigpipeBlock()
{
    const int errorBefore = errno;
    if (!wasPending_)
    {
        consumeSigpipe();
    }
    pthread_sigmask(SIG_SETMASK, &maskBefore_, nullptr);
    errno = errorBefore;
}

} // namespace vclink::git
