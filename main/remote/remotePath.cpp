// SPDX-License-Identifier: MIT
#include "main/remote/remotePath.hpp"

#include <cerrno>
#include <charconv>
#include <cstddef>
#include <fstream>
#include <string_view>

#include <unistd.h>

#include "error/errorUtil/raiseSystemError.hpp"
#include "main/checkout/standing.hpp"
#include "main/remote/Refspec.hpp"

namespace vclink::git
{
namespace
{

/// Replaces "%20" and the like.
std::string decode(std::string_view text)
{
    constexpr std::size_t digits = 2;
    std::string decoded;
    for (std::size_t place = 0; place < text.size(); ++place)
    {
        char character = text[place];
        if (character == '%' && place + digits < text.size())
        {
            constexpr int base = 16;
            unsigned char byte = 0;
            const char *const begin = text.data() + place + 1;
            if (std::from_chars(begin, begin + digits, byte, base).ptr == begin + digits)
            {
                character = static_cast<char>(byte);
                place += digits;
            }
        }
        decoded += character;
    }
    return decoded;
}

void refuseUnreadable(const std::string &path, int error)
{
    if (error != 0 && error != ENOENT && error != ENOTDIR)
    {
        raiseSystemError(error, "could not read '" + path + "'");
    }
}

/// Returns the first line; empty if there is no such file.
std::string readFirstLine(const std::string &path)
{
    errno = 0;
    std::ifstream file(path);
    std::string line;
    std::getline(file, line);
    refuseUnreadable(path, file.bad() ? EIO : (file.is_open() ? 0 : errno));
    return line;
}

/// Returns the reference that a HEAD names, or any other line as it is.
std::string readReference(const std::string &path)
{
    constexpr std::string_view link = "ref: ";
    const std::string line = readFirstLine(path);
    return isIn(link, line) ? line.substr(link.size()) : line;
}

/// Returns 0, or why the path cannot be examined.
int examine(const std::string &path)
{
    return ::access(path.c_str(), F_OK) == 0 ? 0 : errno;
}

std::string repositoryAt(const std::string &path)
{
    const std::string inside = path + "/.git";
    return examine(inside) == 0 ? inside : path;
}

} // namespace

std::optional<std::string> findRemotePath(const std::string &address)
{
    constexpr std::string_view scheme = "file://";
    if (isIn(scheme, address))
    {
        const std::string path = address.substr(scheme.size());
        const std::size_t slash = path.find('/');
        return slash == std::string::npos ? std::nullopt
                                          : std::optional(decode(path.substr(slash)));
    }
    // Everything else with a colon has a scheme or a host.
    return address.find(':') == std::string::npos ? std::optional(address) : std::nullopt;
}

std::set<std::string> findCheckedOut(const std::string &path)
{
    const std::string trees = repositoryAt(path) + "/worktrees";
    const int error = examine(trees);
    refuseUnreadable(trees, error);
    std::set<std::string> branches;
    const auto addBranches = [&](const std::string &tree)
    {
        for (const char *const file :
             {"/HEAD", "/rebase-merge/head-name", "/rebase-apply/head-name", "/BISECT_START"})
        {
            const std::string name = readReference(trees + '/' + tree + file);
            // A bisection has the short name.
            branches.insert(isIn(branchesFolder, name) ? name : std::string(branchesFolder) + name);
        }
        return true;
    };
    if (error == 0 && !visitFolder(trees, addBranches))
    {
        refuseUnreadable(trees, errno != 0 ? errno : EIO);
    }
    return branches;
}

std::string findCurrent(const std::string &path)
{
    return readReference(repositoryAt(path) + "/HEAD");
}

} // namespace vclink::git
