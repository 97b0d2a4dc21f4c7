// SPDX-License-Identifier: MIT
#include "main/ForceLinkGuard.hpp"

#include <cerrno>
#include <climits>
#include <cstddef>

#include <git2/repository.h>
#include <sys/stat.h>
#include <unistd.h>

#include "error/errorUtil/raiseSystemError.hpp"

namespace vclink::git
{
namespace
{

bool isLink(const std::string &path)
{
    struct stat status = {};
    return lstat(path.c_str(), &status) == 0 && S_ISLNK(status.st_mode);
}

std::string readLink(const std::string &path)
{
    std::string target(PATH_MAX, '\0');
    const ssize_t size = ::readlink(path.c_str(), target.data(), target.size());
    target.resize(size > 0 ? static_cast<std::size_t>(size) : 0);
    return target;
}

} // namespace

ForceLinkGuard::ForceLinkGuard(git_repository *repository, git_checkout_options &record)
    : LinkGuard(record)
{
    const char *const workdir = git_repository_workdir(repository);
    workdir_ = workdir != nullptr ? workdir : "";
}

ForceLinkGuard::~ForceLinkGuard()
{
    for (const auto &[path, target] : removed_)
    {
        // Fails where something has come into its place, which stays: after a checkout, everywhere.
        static_cast<void>(::symlink(target.c_str(), path.c_str()) == 0);
    }
}

int ForceLinkGuard::notify(git_checkout_notify_t /*why*/, const char *path,
                           const git_diff_file * /*baseline*/, const git_diff_file *target,
                           const git_diff_file * /*workdir*/)
{
    if (path != nullptr && target != nullptr)
    {
        clearTheWay(path);
    }
    return 0;
}

void ForceLinkGuard::clearTheWay(const std::string &name)
{
    for (auto end = name.find('/'); end != std::string::npos; end = name.find('/', end + 1))
    {
        removeLink(workdir_ + name.substr(0, end));
    }
    removeLink(workdir_ + name);
}

void ForceLinkGuard::removeLink(const std::string &path)
{
    if (!isLink(path))
    {
        return;
    }
    removed_.emplace_back(path, readLink(path));
    if (::unlink(path.c_str()) != 0)
    {
        const int error = errno;
        raiseSystemError(error, "could not remove the link '" + path + "'");
    }
}

} // namespace vclink::git
