// SPDX-License-Identifier: MIT
#include "support/processes.hpp"

#include <cerrno>
#include <system_error>

#include <poll.h>
#include <sys/syscall.h>
#include <sys/wait.h>
#include <unistd.h>

#include "support/Descriptor.hpp"

namespace vclink::test
{
namespace
{

[[noreturn]] void raiseError(const char *what)
{
    throw std::system_error(errno, std::generic_category(), what);
}

/// As endsWithin(), where a process can't be watched, under valgrind for one.
bool lookForEnd(pid_t child, std::chrono::milliseconds time)
{
    const auto end = std::chrono::steady_clock::now() + time;
    for (;;)
    {
        siginfo_t info = {};
        if (::waitid(P_PID, static_cast<id_t>(child), &info, WEXITED | WNOHANG | WNOWAIT) != 0)
            raiseError("waitid");
        if (info.si_pid == child || std::chrono::steady_clock::now() >= end)
            return info.si_pid == child;
        ::poll(nullptr, 0, 1);
    }
}

} // namespace

std::vector<char *> makePointers(std::vector<std::string> &texts)
{
    std::vector<char *> pointers;
    pointers.reserve(texts.size() + 1);
    for (auto &text : texts)
        pointers.push_back(text.data());
    pointers.push_back(nullptr);
    return pointers;
}

bool endsWithin(pid_t child, std::chrono::milliseconds time)
{
    // The C library's own declaration of this call can't be linked from C++ in every release.
    const auto opened = ::syscall(SYS_pidfd_open, child, 0);
    if (opened < 0 && errno == ENOSYS)
        return lookForEnd(child, time);
    const auto watched = Descriptor::checked(static_cast<int>(opened), "pidfd_open");
    const auto end = std::chrono::steady_clock::now() + time;
    for (;;)
    {
        const auto left = std::chrono::duration_cast<std::chrono::milliseconds>(
            end - std::chrono::steady_clock::now());
        pollfd event{watched.get(), POLLIN, 0};
        const int ready = ::poll(&event, 1, left.count() > 0 ? static_cast<int>(left.count()) : 0);
        if (ready >= 0)
            return ready > 0;
        if (errno != EINTR)
            raiseError("poll");
    }
}

int collectStatus(pid_t child)
{
    int status = 0;
    while (::waitpid(child, &status, 0) < 0)
    {
        if (errno != EINTR)
            raiseError("waitpid");
    }
    return status;
}

} // namespace vclink::test
