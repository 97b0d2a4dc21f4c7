// SPDX-License-Identifier: MIT
#include "GitConfigFixture.hpp"

#include <cstdlib>

#include <git2.h>

#include "fl/filesystem/operations.hpp"
#include "support/UnprivilegedUser.hpp"
#include "support/text.hpp"
#include "vclink_host/installation.hpp"

namespace vclink::test
{

InstallPath::InstallPath(const std::string &folder) : before_(fl::filesystem::get_install_path())
{
    vclink_host::setInstallPath(asUtf16(folder));
}

InstallPath::~InstallPath()
{
    vclink_host::setInstallPath(before_);
}

std::string shown(const std::optional<ustring> &value)
{
    return value ? asUtf8(*value) : "no value";
}

std::string GitConfigFixture::read(const std::filesystem::path &file)
{
    return GitRepository(file.parent_path()).read(file.filename());
}

void GitConfigFixture::writeFile(const std::filesystem::path &file, const std::string &bytes)
{
    GitRepository(file.parent_path()).write(file.filename(), bytes);
}

std::string GitConfigFixture::byGit(const std::string &key) const
{
    return GitRepository(folder().path()).line({"config", "--global", "--get", key});
}

std::string GitConfigFixture::runIn(const std::map<std::string, std::string> &environment,
                                    const std::function<std::string()> &action) const
{
    return runAsUnprivilegedUser(
        [&]
        {
            while (git_libgit2_shutdown() > 0)
                continue;
            for (const auto &[name, value] : environment)
            {
                if (value.empty())
                    ::unsetenv(name.c_str());
                else
                    ::setenv(name.c_str(), value.c_str(), 1);
            }
            return action();
        });
}

} // namespace vclink::test
