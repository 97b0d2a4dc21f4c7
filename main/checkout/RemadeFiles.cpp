// SPDX-License-Identifier: MIT
#include "main/checkout/RemadeFiles.hpp"

#include <cerrno>
#include <cstddef>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include "error/errorUtil/raiseSystemError.hpp"
#include "main/checkout/standing.hpp"

namespace vclink::git
{
namespace
{

[[noreturn]] void raiseUnexamined(int error, const std::string &path)
{
    raiseSystemError(error, "could not look at '" + path + "'");
}

/// Returns 0, or why the file cannot be opened for writing. Only the opening finds out that a
/// program runs, and only programs are opened, because other processes can see that.
int writeError(const std::string &path, const struct stat &status)
{
    if ((status.st_mode & (S_IXUSR | S_IXGRP | S_IXOTH)) == 0)
    {
        return ::faccessat(AT_FDCWD, path.c_str(), W_OK, AT_EACCESS) == 0 ? 0 : errno;
    }
    const int file = ::open(path.c_str(), O_WRONLY | O_NOFOLLOW | O_NONBLOCK | O_CLOEXEC);
    if (file == -1)
    {
        return errno;
    }
    ::close(file);
    return 0;
}

/// Returns true if the file's name can be removed from its folder.
bool isRemovable(const std::string &path, const struct stat &status)
{
    const std::string folder = path.substr(0, path.rfind('/') + 1);
    struct stat above = {};
    if (!unwritableFolderAbove(path).empty() || ::stat(folder.c_str(), &above) != 0)
    {
        return false;
    }
    const uid_t user = ::geteuid();
    return (above.st_mode & S_ISVTX) == 0 || user == 0 || user == status.st_uid ||
           user == above.st_uid;
}

} // namespace

bool mustBeRemade(const std::string &path)
{
    struct stat status = {};
    return ::lstat(path.c_str(), &status) == 0 && S_ISREG(status.st_mode) &&
           (status.st_nlink != 1 || writeError(path, status) != 0);
}

std::string RemadeFiles::note(const std::string &path, bool isExecutable)
{
    struct stat status = {};
    if (::lstat(path.c_str(), &status) != 0)
    {
        const int error = errno;
        if (error != ENOENT && error != ENOTDIR)
        {
            raiseUnexamined(error, path);
        }
        return isCreatable(path) ? "" : "cannot be created in its folder";
    }
    if (!S_ISREG(status.st_mode))
    {
        return {};
    }
    const int error = writeError(path, status);
    if (error == EPERM || error == EROFS)
    {
        return "can be neither written to nor replaced";
    }
    if (error != 0 && error != EACCES && error != ETXTBSY)
    {
        raiseUnexamined(error, path);
    }
    const bool isRemade = error != 0 || status.st_nlink != 1;
    // libgit2 itself creates such a file again.
    const bool isExchanged = ((status.st_mode & S_IXUSR) != 0) != isExecutable;
    if ((isRemade || isExchanged) && !isRemovable(path, status))
    {
        const std::string reason = error != 0 ? "cannot be written to"
                                   : isRemade ? "has further names"
                                              : "changes its permissions";
        return reason + ", and its folder cannot be written to";
    }
    if (isRemade)
    {
        paths_.push_back(path);
    }
    return {};
}

bool RemadeFiles::isCreatable(const std::string &path)
{
    const std::size_t size = path.rfind('/') + 1;
    if (path.compare(0, size, folder_) == 0)
    {
        return isFolderWritable_;
    }
    folder_ = path.substr(0, size);
    isFolderWritable_ = unwritableFolderAbove(path).empty();
    return isFolderWritable_;
}

void RemadeFiles::remove() noexcept
{
    for (const std::string &path : paths_)
    {
        ::unlink(path.c_str());
    }
    paths_.clear();
}

} // namespace vclink::git
