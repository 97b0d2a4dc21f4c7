// SPDX-License-Identifier: MIT
#include "util/repository/reflogAccess.hpp"

#include <cerrno>
#include <string>

#include <fcntl.h>
#include <ftw.h>
#include <git2/config.h>
#include <git2/repository.h>
#include <sys/stat.h>
#include <unistd.h>

#include "error/errorUtil/GitResult.hpp"
#include "error/errorUtil/raiseSystemError.hpp"

namespace vclink::git
{
namespace
{

/// Each working tree has a reflog of HEAD; all working trees of a repository share the others.
std::string pathOfReflog(git_repository *repository, const std::string &reference)
{
    const char *const folder = reference == "HEAD" ? git_repository_path(repository)
                                                   : git_repository_commondir(repository);
    return folder + ("logs/" + reference);
}

/// Returns 0, or why the process may not do this with the file or folder.
int accessError(const std::string &path, int mode)
{
    return ::faccessat(AT_FDCWD, path.c_str(), mode, AT_EACCESS) == 0 ? 0 : errno;
}

bool isMissing(int error)
{
    return error == ENOENT || error == ENOTDIR;
}

std::string folderOf(const std::string &path)
{
    return path.substr(0, path.rfind('/'));
}

/// Returns true also for a link to nothing.
bool isAnything(const std::string &path)
{
    struct stat status = {};
    return ::lstat(path.c_str(), &status) == 0;
}

/// Stops at what is no folder.
int passFolder(const char * /*path*/, const struct stat * /*status*/, int type, FTW * /*place*/)
{
    return type == FTW_D ? 0 : 1;
}

/// Returns true for a folder that contains nothing but such folders. False for a link.
bool hasOnlyFolders(const std::string &path)
{
    constexpr int descriptors = 8;
    return ::nftw(path.c_str(), passFolder, descriptors, FTW_PHYS) == 0;
}

/// Returns 0, or why nothing can be created in the folder, which may be missing.
int creationError(const std::string &folder)
{
    struct stat status = {};
    if (::stat(folder.c_str(), &status) == 0)
    {
        return S_ISDIR(status.st_mode) ? accessError(folder, W_OK | X_OK) : ENOTDIR;
    }
    const int error = errno;
    const bool isMissingToo = error == ENOENT && !folder.empty() && !isAnything(folder);
    return isMissingToo ? creationError(folderOf(folder)) : error;
}

/// Returns 0, or why libgit2 can neither append to the reflog nor make it.
int appendError(const std::string &path)
{
    struct stat status = {};
    if (::stat(path.c_str(), &status) != 0)
    {
        const int error = errno;
        return error == ENOENT && !isAnything(path) ? creationError(folderOf(path)) : error;
    }
    if (S_ISDIR(status.st_mode))
    {
        // libgit2 removes such folders: they are left of deleted branches.
        return hasOnlyFolders(path) ? creationError(folderOf(path)) : EISDIR;
    }
    // Whoever opens a FIFO waits for a reader.
    return S_ISREG(status.st_mode) || S_ISCHR(status.st_mode) ? accessError(path, W_OK) : ENXIO;
}

/// Returns true if core.logAllRefUpdates is false: then libgit2 leaves reflogs alone.
bool isOff(git_repository *repository)
{
    const auto config = acquire<git_config>(git_repository_config_snapshot, repository);
    int value = 1;
    return config.has_value() &&
           call(git_config_get_bool, &value, config.value().get(), "core.logAllRefUpdates")
               .has_value() &&
           value == 0;
}

} // namespace

void refuseUnwritableReflog(git_repository *repository, const char *reference)
{
    const std::string path = pathOfReflog(repository, reference);
    const int error = appendError(path);
    if (error != 0 && !isOff(repository))
    {
        raiseSystemError(error, "could not append to '" + path + "'");
    }
}

void refuseUnremovableReflog(git_repository *repository, const char *reference)
{
    const std::string path = pathOfReflog(repository, reference);
    const bool isThere = !isMissing(accessError(path, F_OK));
    const int error = accessError(folderOf(path), W_OK | X_OK);
    if (isThere && error != 0)
    {
        raiseSystemError(error, "could not remove '" + path + "'");
    }
}

} // namespace vclink::git
