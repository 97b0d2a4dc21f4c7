// SPDX-License-Identifier: MIT
#include "support/TemporaryFolder.hpp"

#include <cstdlib>
#include <fstream>
#include <iostream>
#include <iterator>
#include <stdexcept>

#include <boost/filesystem/operations.hpp>

#include <grp.h>
#include <sys/wait.h>
#include <unistd.h>

#include "fl/i18n/convert.hpp"

namespace vclink_host_tests
{
namespace
{

constexpr uid_t unprivileged = 65534;

bool dropPrivileges()
{
    return ::geteuid() != 0 || (::setgroups(0, nullptr) == 0 && ::setgid(unprivileged) == 0 &&
                                ::setuid(unprivileged) == 0);
}

[[noreturn]] void runChild(const std::function<bool()> &check)
{
    bool isPassed = false;
    try
    {
        isPassed = dropPrivileges() && check();
    }
    catch (const std::exception &error)
    {
        std::cerr << error.what() << '\n';
    }
    ::_exit(isPassed ? EXIT_SUCCESS : EXIT_FAILURE);
}

} // namespace

TemporaryFolder::TemporaryFolder()
{
    const auto pattern = boost::filesystem::temp_directory_path() / "vclink-host-XXXXXX";
    path_ = pattern.string();
    if (::mkdtemp(path_.data()) == nullptr)
    {
        throw std::runtime_error("no temporary folder: " + path_);
    }
}

TemporaryFolder::~TemporaryFolder()
{
    boost::system::error_code ignored;
    boost::filesystem::permissions(path_, boost::filesystem::owner_all, ignored);
    boost::filesystem::remove_all(path_, ignored);
}

std::string TemporaryFolder::file(const std::string &name) const
{
    return path_ + '/' + name;
}

ustring TemporaryFolder::ufile(const std::string &name) const
{
    return fl::i18n::utf8_to_ustring(file(name));
}

std::string readFile(const std::string &path)
{
    std::ifstream stream(path, std::ios_base::binary);
    return {std::istreambuf_iterator<char>(stream), std::istreambuf_iterator<char>()};
}

void writeFile(const std::string &path, const std::string &content)
{
    std::ofstream stream(path, std::ios_base::binary);
    stream << content;
    if (!stream.flush())
    {
        throw std::runtime_error("could not write " + path);
    }
}

bool checkAsUnprivilegedUser(const std::function<bool()> &check)
{
    const pid_t child = ::fork();
    if (child == 0)
    {
        runChild(check);
    }
    int status = -1;
    return child > 0 && ::waitpid(child, &status, 0) == child && WIFEXITED(status) &&
           WEXITSTATUS(status) == EXIT_SUCCESS;
}

ScopedVariable::ScopedVariable(const char *name, const char *value)
    : name_(name), wasSet_(std::getenv(name) != nullptr)
{
    if (wasSet_)
    {
        before_ = std::getenv(name);
    }
    ::setenv(name, value, 1);
}

ScopedVariable::~ScopedVariable()
{
    if (wasSet_)
    {
        ::setenv(name_.c_str(), before_.c_str(), 1);
    }
    else
    {
        ::unsetenv(name_.c_str());
    }
}

} // namespace vclink_host_tests
