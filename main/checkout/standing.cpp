// SPDX-License-Identifier: MIT
#include "main/checkout/standing.hpp"

#include <cerrno>
#include <climits>
#include <cstddef>
#include <memory>

#include <dirent.h>
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include "error/errorUtil/raiseSystemError.hpp"

namespace vclink::git
{

Standing standingAt(const std::string &path)
{
    struct stat status = {};
    return standingAt(path, status);
}

Standing standingAt(const std::string &path, struct stat &status)
{
    if (::lstat(path.c_str(), &status) != 0)
    {
        const int error = errno;
        status = {};
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
    bool isFound = false;
    const bool isRead =
        visitFolder(path,
                    [&](const std::string &entry)
                    {
                        const std::string inside = path + '/' + entry;
                        isFound = standingAt(inside) != Standing::Folder || holdsFiles(inside);
                        return !isFound;
                    });
    return isFound || !isRead;
}

bool visitFolder(const std::string &path, const std::function<bool(const std::string &)> &visitor)
{
    // The standard library's iterators end the process if memory runs out.
    const std::unique_ptr<DIR, int (*)(DIR *)> folder(::opendir(path.c_str()), ::closedir);
    if (folder == nullptr)
    {
        return false;
    }
    errno = 0;
    while (const dirent *const entry = ::readdir(folder.get()))
    {
        const std::string name = entry->d_name;
        if (name != "." && name != ".." && !visitor(name))
        {
            return true;
        }
        errno = 0;
    }
    return errno == 0;
}

bool isEmptyFolder(const std::string &path)
{
    bool isEmpty = true;
    const bool isRead = visitFolder(path,
                                    [&isEmpty](const std::string &)
                                    {
                                        isEmpty = false;
                                        return false;
                                    });
    return isRead && isEmpty;
}

std::string unwritableFolderAbove(const std::string &path)
{
    std::string folder = path.substr(0, path.rfind('/') + 1);
    const auto accessError = [&folder]
    { return ::faccessat(AT_FDCWD, folder.c_str(), W_OK | X_OK, AT_EACCESS) == 0 ? 0 : errno; };
    int error = accessError();
    while (folder.size() > 1 && (error == ENOENT || error == ENOTDIR))
    {
        folder.pop_back();
        folder.resize(folder.rfind('/') + 1);
        error = accessError();
    }
    return error == EACCES || error == EROFS ? folder : "";
}

std::string readLink(const std::string &path)
{
    std::string target(PATH_MAX, '\0');
    const ssize_t size = ::readlink(path.c_str(), target.data(), target.size());
    target.resize(size > 0 ? static_cast<std::size_t>(size) : 0);
    return target;
}

} // namespace vclink::git
