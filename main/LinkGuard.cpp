// SPDX-License-Identifier: MIT
#include "main/LinkGuard.hpp"

#include <cerrno>
#include <climits>
#include <cstddef>

#include <fcntl.h>
#include <git2/repository.h>
#include <sys/stat.h>
#include <unistd.h>

#include "error/errorUtil/callbackException.hpp"
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

LinkGuard::LinkGuard(git_repository *repository, git_checkout_options &record)
    : next_(record.notify_cb), nextPayload_(record.notify_payload)
{
    const char *const workdir = git_repository_workdir(repository);
    workdir_ = workdir != nullptr ? workdir : "";
    record.notify_cb = notify;
    record.notify_payload = this;
    // A link that comes later must not be written through either.
    record.file_open_flags = O_CREAT | O_TRUNC | O_WRONLY | O_NOFOLLOW;
}

LinkGuard::~LinkGuard()
{
    for (const auto &[path, target] : removed_)
    {
        // Fails where something has come into its place, which stays: after a checkout, everywhere.
        static_cast<void>(::symlink(target.c_str(), path.c_str()) == 0);
    }
}

int LinkGuard::notify(git_checkout_notify_t why, const char *path, const git_diff_file *baseline,
                      const git_diff_file *target, const git_diff_file *workdir,
                      void *payload) noexcept
{
    auto &guard = *static_cast<LinkGuard *>(payload);
    const int code = guard.next_(why, path, baseline, target, workdir, guard.nextPayload_);
    if (code != 0 || path == nullptr || target == nullptr)
    {
        return code;
    }
    try
    {
        guard.clearTheWay(path);
        return 0;
    }
    catch (...)
    {
        return parkCallbackException();
    }
}

void LinkGuard::clearTheWay(const std::string &name)
{
    for (auto end = name.find('/'); end != std::string::npos; end = name.find('/', end + 1))
    {
        removeLink(workdir_ + name.substr(0, end));
    }
    removeLink(workdir_ + name);
}

void LinkGuard::removeLink(const std::string &path)
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
