// SPDX-License-Identifier: MIT
#include "util/command/FailedStartCleanup.hpp"

#include <algorithm>
#include <array>
#include <cerrno>
#include <csignal>
#include <cstdlib>
#include <iterator>
#include <string>
#include <vector>

#include <fcntl.h>
#include <poll.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include "util/scope/ScopedCleanup.hpp"

namespace vclink::git
{
namespace
{

/// Reads a file to its end.
/// @return true if it was read
bool readAll(int descriptor, std::string &bytes)
{
    std::array<char, 256> part{};
    ssize_t size = 0;
    while ((size = ::read(descriptor, part.data(), part.size())) != 0)
    {
        if (size > 0)
        {
            bytes.append(part.data(), static_cast<std::size_t>(size));
        }
        else if (errno != EINTR)
        {
            return false;
        }
    }
    return true;
}

std::set<pid_t> parseProcesses(const std::string &text)
{
    std::set<pid_t> processes;
    const char *next = text.c_str();
    char *end = nullptr;
    for (long number = std::strtol(next, &end, 10); end != next;
         number = std::strtol(next, &end, 10))
    {
        processes.insert(static_cast<pid_t>(number));
        next = end;
    }
    return processes;
}

/// Returns the children of the calling thread that nobody has waited for, or nothing if they are
/// unknown, for example if no descriptor is left to read their list.
std::optional<std::set<pid_t>> readChildren()
{
    const int descriptor = ::open("/proc/thread-self/children", O_RDONLY | O_CLOEXEC);
    if (descriptor < 0)
    {
        return std::nullopt;
    }
    const ScopedCleanup closing([descriptor] { ::close(descriptor); });
    std::string list;
    if (!readAll(descriptor, list))
    {
        return std::nullopt;
    }
    return parseProcesses(list);
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

/// Returns true if a child ends, within a second, in the way of one that could not become the
/// command. Does not wait for the child.
bool hasFailedToStart(pid_t child) noexcept
{
    constexpr int timeLimit = 1000;
    siginfo_t info = {};
    for (int time = 0; time <= timeLimit; ++time)
    {
        const int code =
            ::waitid(P_PID, static_cast<id_t>(child), &info, WEXITED | WNOWAIT | WNOHANG);
        if (code != 0 || info.si_pid == child)
        {
            break;
        }
        ::poll(nullptr, 0, 1);
    }
    return info.si_pid == child && info.si_code == CLD_EXITED && info.si_status == EXIT_FAILURE;
}

} // namespace

FailedStartCleanup::FailedStartCleanup(int source, int sink)
    : source_(source), sink_(sink), childrenBefore_(readChildren())
{
}

FailedStartCleanup::~FailedStartCleanup()
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

void FailedStartCleanup::closeSink() const noexcept
{
    // Some releases close it themselves; then another file can have the number.
    if (referToSameFile(source_, sink_))
    {
        ::close(sink_);
    }
}

void FailedStartCleanup::reapFailedChild() const
{
    const std::optional<std::set<pid_t>> children = readChildren();
    if (!childrenBefore_ || !children)
    {
        return;
    }
    std::vector<pid_t> added;
    std::set_difference(children->begin(), children->end(), childrenBefore_->begin(),
                        childrenBefore_->end(), std::back_inserter(added));
    // If there are several, a thread has ended and left its children to this one. They belong to
    // others: rather leave a failed child than wait for one of these.
    if (added.size() == 1 && hasFailedToStart(added.front()))
    {
        reap(added.front());
    }
}

} // namespace vclink::git
