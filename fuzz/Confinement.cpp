// SPDX-License-Identifier: MIT
#include "Confinement.hpp"

#include <algorithm>
#include <cerrno>
#include <climits>
#include <cstdarg>
#include <cstdlib>
#include <utility>

#include <fcntl.h>
#include <netdb.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/time.h>
#include <unistd.h>

#include "support/interposition.hpp"

namespace
{

bool isConfined = false;
/// Made when they are first asked for: the functions below run before everything else.
std::vector<std::string> &allowedFolders()
{
    static std::vector<std::string> folders;
    return folders;
}
std::string &firstTrespass()
{
    static std::string trespass;
    return trespass;
}

/// Where a path leads. Of one that does not exist, and where the last element is not followed, the
/// folder decides; empty where there is no folder either, and so nothing can be changed.
std::string resolve(const char *path, bool follow)
{
    char resolved[PATH_MAX];
    if (follow && ::realpath(path, resolved) != nullptr)
        return resolved;
    std::string folder(path);
    folder.erase(folder.find_last_not_of('/') + 1);
    const std::size_t slash = folder.rfind('/');
    folder = slash == std::string::npos ? "." : folder.substr(0, slash + 1);
    return ::realpath(folder.c_str(), resolved) != nullptr ? std::string(resolved) + "/."
                                                           : std::string();
}

bool isAllowed(const std::string &place)
{
    const auto &folders = allowedFolders();
    return place.empty() || place == "/dev/null" ||
           std::any_of(folders.begin(), folders.end(),
                       [&](const std::string &folder)
                       { return place.compare(0, folder.size() + 1, folder + '/') == 0; });
}

enum class Last
{
    Followed,
    Taken
};

/// Whether the change of a path is to be refused.
bool refuses(const char *function, const char *path, Last last)
{
    if (!isConfined || path == nullptr || isAllowed(resolve(path, last == Last::Followed)))
        return false;
    if (firstTrespass().empty())
        firstTrespass() = std::string(function) + ' ' + path;
    errno = EACCES;
    return true;
}

} // namespace

namespace vclink::fuzz
{

Confinement::Confinement(std::vector<std::string> folders)
{
    allowedFolders() = std::move(folders);
    isConfined = true;
}

Confinement::~Confinement()
{
    isConfined = false;
}

std::string Confinement::takeTrespass()
{
    return std::exchange(firstTrespass(), {});
}

} // namespace vclink::fuzz

using vclink::test::findNext;
using vclink::test::readMode;

extern "C"
{
#pragma GCC visibility push(default)

    int open(const char *path, int flags, ...)
    {
        va_list arguments;
        va_start(arguments, flags);
        const mode_t mode = readMode(flags, arguments);
        va_end(arguments);
        static auto *const real = findNext<int(const char *, int, ...)>("open");
        const bool writes = (flags & (O_WRONLY | O_RDWR | O_CREAT | O_TRUNC)) != 0;
        const bool isNew = (flags & (O_CREAT | O_EXCL)) == (O_CREAT | O_EXCL);
        return writes && refuses("open", path, isNew ? Last::Taken : Last::Followed)
                   ? -1
                   : real(path, flags, mode);
    }

    int mkdir(const char *path, mode_t mode) noexcept
    {
        static auto *const real = findNext<int(const char *, mode_t)>("mkdir");
        return refuses("mkdir", path, Last::Taken) ? -1 : real(path, mode);
    }

    int rmdir(const char *path) noexcept
    {
        static auto *const real = findNext<int(const char *)>("rmdir");
        return refuses("rmdir", path, Last::Taken) ? -1 : real(path);
    }

    int unlink(const char *path) noexcept
    {
        static auto *const real = findNext<int(const char *)>("unlink");
        return refuses("unlink", path, Last::Taken) ? -1 : real(path);
    }

    int rename(const char *from, const char *to) noexcept
    {
        static auto *const real = findNext<int(const char *, const char *)>("rename");
        return refuses("rename", from, Last::Taken) || refuses("rename", to, Last::Taken)
                   ? -1
                   : real(from, to);
    }

    int link(const char *from, const char *to) noexcept
    {
        static auto *const real = findNext<int(const char *, const char *)>("link");
        return refuses("link", to, Last::Taken) ? -1 : real(from, to);
    }

    int symlink(const char *target, const char *path) noexcept
    {
        static auto *const real = findNext<int(const char *, const char *)>("symlink");
        return refuses("symlink", path, Last::Taken) ? -1 : real(target, path);
    }

    int chmod(const char *path, mode_t mode) noexcept
    {
        static auto *const real = findNext<int(const char *, mode_t)>("chmod");
        return refuses("chmod", path, Last::Followed) ? -1 : real(path, mode);
    }

    int utimes(const char *path, const timeval times[2]) noexcept
    {
        static auto *const real = findNext<int(const char *, const timeval *)>("utimes");
        return refuses("utimes", path, Last::Followed) ? -1 : real(path, times);
    }

    pid_t fork() noexcept
    {
        static auto *const real = findNext<pid_t()>("fork");
        errno = EAGAIN;
        return isConfined ? -1 : real();
    }

    int connect(int descriptor, const sockaddr *address, socklen_t length)
    {
        static auto *const real = findNext<int(int, const sockaddr *, socklen_t)>("connect");
        errno = ENETUNREACH;
        return isConfined ? -1 : real(descriptor, address, length);
    }

    int getaddrinfo(const char *name, const char *service, const addrinfo *hints, addrinfo **found)
    {
        static auto *const real =
            findNext<int(const char *, const char *, const addrinfo *, addrinfo **)>("getaddrinfo");
        return isConfined ? EAI_FAIL : real(name, service, hints, found);
    }

#pragma GCC visibility pop
}
