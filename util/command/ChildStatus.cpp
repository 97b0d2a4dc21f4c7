// SPDX-License-Identifier: MIT
#include "util/command/ChildStatus.hpp"

#include <cerrno>
#include <csignal>

#include <sys/wait.h>

namespace vclink::git
{

bool isChildStatusKept() noexcept
{
    struct sigaction action = {};
    return ::sigaction(SIGCHLD, nullptr, &action) != 0 ||
           ((action.sa_flags & SA_NOCLDWAIT) == 0 && action.sa_handler != SIG_IGN);
}

bool ChildStatus::isRunning(std::error_code &error) noexcept
{
    if (!ended_)
    {
        look(WNOHANG, error);
    }
    return !ended_ && !error;
}

int ChildStatus::wait(std::error_code &error) noexcept
{
    if (!ended_)
    {
        look(0, error);
    }
    return status_;
}

void ChildStatus::look(int options, std::error_code &error) noexcept
{
    siginfo_t info = {};
    int code = 0;
    do
    {
        // Does not wait for the child, so that nothing is lost if this call is too early.
        code = ::waitid(P_PID, static_cast<id_t>(child_), &info, WEXITED | WNOWAIT | options);
    } while (code != 0 && errno == EINTR);
    if (code != 0)
    {
        error = std::error_code(errno, std::system_category());
    }
    else if (info.si_pid != 0) // Zero as long as the child runs.
    {
        ended_ = true;
        status_ = info.si_status;
    }
}

} // namespace vclink::git
