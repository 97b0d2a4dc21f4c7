// SPDX-License-Identifier: MIT
#include "main/checkout/HardLinks.hpp"

#include <cerrno>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include "error/errorUtil/raiseSystemError.hpp"

namespace vclink::git
{

bool HardLinks::note(const std::string &path)
{
    struct stat status = {};
    if (::lstat(path.c_str(), &status) != 0)
    {
        const int error = errno;
        if (error != ENOENT && error != ENOTDIR)
        {
            raiseSystemError(error, "could not look at '" + path + "'");
        }
        return true;
    }
    if (!S_ISREG(status.st_mode) || status.st_nlink == 1)
    {
        return true;
    }
    const std::string folder = path.substr(0, path.rfind('/') + 1);
    if (::faccessat(AT_FDCWD, folder.c_str(), W_OK, AT_EACCESS) != 0)
    {
        return false;
    }
    paths_.push_back(path);
    return true;
}

void HardLinks::part() noexcept
{
    for (const std::string &path : paths_)
    {
        ::unlink(path.c_str());
    }
    paths_.clear();
}

} // namespace vclink::git
