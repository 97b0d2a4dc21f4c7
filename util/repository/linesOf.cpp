// SPDX-License-Identifier: MIT
#include "util/repository/linesOf.hpp"

#include <cerrno>
#include <fstream>

#include "error/errorUtil/raiseSystemError.hpp"

namespace vclink::git
{
namespace
{

[[noreturn]] void raiseUnreadFile(const std::string &path, int error)
{
    raiseSystemError(error, "could not read '" + path + "'");
}

} // namespace

std::vector<std::string> linesOf(const std::string &path)
{
    errno = 0;
    std::ifstream file(path);
    if (!file && errno != ENOENT && errno != ENOTDIR)
    {
        raiseUnreadFile(path, errno);
    }
    std::vector<std::string> lines;
    for (std::string line; std::getline(file, line);)
    {
        lines.push_back(line);
    }
    if (file.bad())
    {
        raiseUnreadFile(path, EIO);
    }
    return lines;
}

} // namespace vclink::git
