// SPDX-License-Identifier: MIT
#include "util/repository/reflogAccess.hpp"

#include <cerrno>
#include <string>

#include <fcntl.h>
#include <git2/repository.h>
#include <unistd.h>

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

} // namespace

void refuseUnwritableReflog(git_repository *repository, const char *reference)
{
    const std::string path = pathOfReflog(repository, reference);
    const int error = accessError(path, W_OK);
    if (error != 0 && !isMissing(error))
    {
        raiseSystemError(error, "could not append to '" + path + "'");
    }
}

void refuseUnremovableReflog(git_repository *repository, const char *reference)
{
    const std::string path = pathOfReflog(repository, reference);
    const bool isThere = !isMissing(accessError(path, F_OK));
    const int error = accessError(path.substr(0, path.rfind('/')), W_OK | X_OK);
    if (isThere && error != 0)
    {
        raiseSystemError(error, "could not remove '" + path + "'");
    }
}

} // namespace vclink::git
