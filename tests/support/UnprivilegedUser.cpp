// SPDX-License-Identifier: MIT
#include "support/UnprivilegedUser.hpp"

#include <cerrno>
#include <system_error>

#include <grp.h>
#include <unistd.h>

#include "support/ChildProcess.hpp"

namespace vclink::test
{
namespace
{

constexpr uid_t nobody = 65534;
constexpr gid_t nogroup = 65534;

[[noreturn]] void raise(const char *what)
{
    throw std::system_error(errno, std::generic_category(), what);
}

void dropPrivileges()
{
    if (!runsAsRoot())
        return;
    if (::setgroups(0, nullptr) != 0 || ::setgid(nogroup) != 0 || ::setuid(nobody) != 0)
        raise("dropping privileges");
}

} // namespace

std::string runAsUnprivilegedUser(const std::function<std::string()> &action,
                                  std::chrono::milliseconds timeout)
{
    return runInChild(
        [&action]
        {
            dropPrivileges();
            return action();
        },
        timeout);
}

void giveToUnprivilegedUser(const std::filesystem::path &path)
{
    namespace fs = std::filesystem;
    if (!runsAsRoot())
        return;
    const auto give = [](const fs::path &given)
    {
        if (::lchown(given.c_str(), nobody, nogroup) != 0)
            raise("lchown");
    };
    give(path);
    if (!fs::is_directory(fs::symlink_status(path)))
        return;
    for (const auto &entry : fs::recursive_directory_iterator(path))
        give(entry.path());
}

bool runsAsRoot() noexcept
{
    return ::geteuid() == 0;
}

} // namespace vclink::test
