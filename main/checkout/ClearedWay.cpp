// SPDX-License-Identifier: MIT
#include "main/checkout/ClearedWay.hpp"

#include <cerrno>
#include <utility>

#include <sys/stat.h>
#include <unistd.h>

#include "error/errorUtil/raiseSystemError.hpp"
#include "main/checkout/standing.hpp"

namespace vclink::git
{

ClearedWay::~ClearedWay()
{
    for (auto removed = removed_.rbegin(); removed != removed_.rend(); ++removed)
    {
        putBack(*removed);
    }
}

void ClearedWay::remove(const std::string &path)
{
    struct stat status = {};
    if (::lstat(path.c_str(), &status) != 0 || S_ISREG(status.st_mode))
    {
        return;
    }
    removed_.push_back({path, status.st_mode, S_ISLNK(status.st_mode) ? readLink(path) : ""});
    const bool isFolder = S_ISDIR(status.st_mode);
    if ((isFolder ? ::rmdir(path.c_str()) : ::unlink(path.c_str())) == 0)
    {
        return;
    }
    const int error = errno;
    removed_.pop_back();
    if (!isFolder)
    {
        raiseSystemError(error, "could not remove '" + path + "'");
    }
}

void ClearedWay::removeLater(const std::string &path)
{
    struct stat status = {};
    if (::lstat(path.c_str(), &status) == 0 && S_ISDIR(status.st_mode))
    {
        noted_.push_back({path, status.st_mode, ""});
        removed_.reserve(removed_.size() + noted_.size());
    }
}

void ClearedWay::removeNoted() noexcept
{
    for (Removed &noted : noted_)
    {
        if (::rmdir(noted.path.c_str()) == 0)
        {
            // Does not allocate: removeLater() has reserved the space.
            removed_.push_back(std::move(noted));
        }
    }
    noted_.clear();
}

/// Fails if something else is in the place, and keeps that: after a checkout this is so in every
/// place.
void ClearedWay::putBack(const Removed &removed)
{
    const char *const path = removed.path.c_str();
    const mode_t permissions = removed.mode & ALLPERMS;
    if (S_ISLNK(removed.mode))
    {
        static_cast<void>(::symlink(removed.target.c_str(), path) == 0);
    }
    else if (S_ISFIFO(removed.mode))
    {
        static_cast<void>(::mkfifo(path, permissions) == 0);
    }
    else if (S_ISDIR(removed.mode))
    {
        static_cast<void>(::mkdir(path, permissions) == 0);
    }
}

} // namespace vclink::git
