// SPDX-License-Identifier: MIT
#include "util/repository/linesOf.hpp"

#include <cerrno>
#include <sstream>

#include "error/errorUtil/raiseSystemError.hpp"
#include "util/scope/wholeFile.hpp"

namespace vclink::git
{
std::vector<std::string> linesOf(const std::string &path)
{
    std::string content;
    const int error = readWholeFile(path, content);
    if (error != 0 && error != ENOENT && error != ENOTDIR)
    {
        raiseSystemError(error, "could not read '" + path + "'");
    }
    std::istringstream text(content);
    std::vector<std::string> lines;
    for (std::string line; std::getline(text, line);)
    {
        lines.push_back(line);
    }
    return lines;
}

} // namespace vclink::git
