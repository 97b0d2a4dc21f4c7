// SPDX-License-Identifier: MIT
#include "util/StartGuard.hpp"

#include <algorithm>
#include <cerrno>
#include <csignal>
#include <cstdlib>
#include <fstream>
#include <iterator>
#include <vector>

#include <poll.h>
#include <sys/stat.h>
#include <sys/syscall.h>
#include <sys/wait.h>
#include <unistd.h>

#include "util/ScopedCleanup.hpp"

namespace vclink::git
{
namespace
{

/// The children that the calling thread has made and that were not waited for; none where the
/// system does not tell.
std::set<pid_t> readChildren()
{
    std::ifstream list("/proc/thread-self/children");
    return {std::istream_iterator<pid_t>(list), std::istream_iterator<pid_t>()};
}

bool referToSameFile(int left, int right) noexcept
{
    struct stat one = {};
    struct stat other = {};
    return ::fstat(left, &one) == 0 && ::fstat(right, &other) == 0 && one.st_dev == other.st_dev &&
           one.st_ino == other.st_ino;
}

void reap(pid_t child) noexcept
{
    while (::waitpid(child, nullptr, 0) < 0 && errno == EINTR)
    {
    }
}

/// Waits for a child that is about to end, a second at most.
void awaitEnd(pid_t child) noexcept
{
    constexpr int timeLimit = 1000;
    const long descriptor = ::syscall(SYS_pidfd_open, child, 0);
    if (descriptor >= 0)
    {
        pollfd end{static_cast<int>(descriptor), POLLIN, 0};
        while (::poll(&end, 1, timeLimit) < 0 && errno == EINTR)
        {
        }
        ::close(end.fd);
    }
}

/// Whether a child has ended as one does that could not become the command.
bool hasFailedToStart(pid_t child) noexcept
{
    siginfo_t info = {};
    return ::waitid(P_PID, static_cast<id_t>(child), &info, WEXITED | WNOWAIT | WNOHANG) == 0 &&
           info.si_pid == child && info.si_code == CLD_EXITED && info.si_status == EXIT_FAILURE;
}

} // namespace

StartGuard::StartGuard(int source, int sink)
    : source_(source), sink_(sink), childrenBefore_(readChildren())
{
}

StartGuard::~StartGuard()
{
    if (ended_)
    {
        return;
    }
    if (child_ != 0)
    {
        reap(child_);
        return;
    }
    closeSink();
    const ScopedCleanup reaping([this] { reapFailedChild(); });
}

void StartGuard::closeSink() const noexcept
{
    // Some releases close it themselves; the number may be another file's by then.
    if (referToSameFile(source_, sink_))
    {
        ::close(sink_);
    }
}

void StartGuard::reapFailedChild() const
{
    const std::set<pid_t> children = readChildren();
    std::vector<pid_t> added;
    std::set_difference(children.begin(), children.end(), childrenBefore_.begin(),
                        childrenBefore_.end(), std::back_inserter(added));
    // With more than one, a thread has ended and left its children to this one: they are somebody
    // else's, and a failed child that stays is the smaller evil.
    if (added.size() != 1)
    {
        return;
    }
    awaitEnd(added.front());
    if (hasFailedToStart(added.front()))
    {
        reap(added.front());
    }
}

} // namespace vclink::git
