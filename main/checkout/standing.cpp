// SPDX-License-Identifier: MIT
#include "main/checkout/standing.hpp"

#include <cerrno>
#include <climits>
#include <cstddef>
#include <filesystem>
#include <system_error>

#include <sys/stat.h>
#include <unistd.h>

#include "error/errorUtil/raiseSystemError.hpp"

namespace vclink::git
{

Standing standingAt(const std::string &path)
{
    struct stat status = {};
    if (::lstat(path.c_str(), &status) != 0)
    {
        const int error = errno;
        if (error != ENOENT && error != ENOTDIR)
        {
            raiseSystemError(error, "could not look at '" + path + "'");
        }
        return Standing::Nothing;
    }
    switch (status.st_mode & S_IFMT)
    {
    case S_IFREG:
        return Standing::File;
    case S_IFLNK:
        return Standing::Link;
    case S_IFDIR:
        return Standing::Folder;
    default:
        return Standing::Special;
    }
}

bool holdsFiles(const std::string &path)
{
    if (standingAt(path) != Standing::Folder)
    {
        return false;
    }
    namespace fs = std::filesystem;
    std::error_code error;
    fs::recursive_directory_iterator entry(path, error);
    for (; !error && entry != fs::recursive_directory_iterator(); entry.increment(error))
    {
        if (entry->symlink_status(error).type() != fs::file_type::directory)
        {
            return true;
        }
    }
    return static_cast<bool>(error);
}

std::string readLink(const std::string &path)
{
    std::string target(PATH_MAX, '\0');
    const ssize_t size = ::readlink(path.c_str(), target.data(), target.size());
    target.resize(size > 0 ? static_cast<std::size_t>(size) : 0);
    return target;
}

} // namespace vclink::git
