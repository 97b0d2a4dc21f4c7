// SPDX-License-Identifier: MIT
#include "main/remote/remotePath.hpp"

#include <cerrno>
#include <charconv>
#include <cstddef>
#include <filesystem>
#include <fstream>
#include <string_view>
#include <system_error>

#include "error/errorUtil/raiseSystemError.hpp"
#include "main/remote/Refspec.hpp"

namespace vclink::git
{
namespace
{

namespace fs = std::filesystem;

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

void refuseUnreadable(const fs::path &path, int error)
{
    if (error != 0 && error != ENOENT && error != ENOTDIR)
    {
        raiseSystemError(error, "could not read '" + path.string() + "'");
    }
}

/// Returns the first line; empty if there is no such file.
std::string readFirstLine(const fs::path &path)
{
    errno = 0;
    std::ifstream file(path);
    std::string line;
    std::getline(file, line);
    refuseUnreadable(path, file.bad() ? EIO : (file.is_open() ? 0 : errno));
    return line;
}

/// Returns the reference that a HEAD names, or any other line as it is.
std::string readReference(const fs::path &path)
{
    constexpr std::string_view link = "ref: ";
    const std::string line = readFirstLine(path);
    return isIn(link, line) ? line.substr(link.size()) : line;
}

fs::path repositoryAt(const std::string &path)
{
    std::error_code error;
    const fs::path inside = fs::path(path) / ".git";
    return fs::exists(inside, error) ? inside : fs::path(path);
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
    std::set<std::string> branches;
    std::error_code error;
    const fs::path trees = repositoryAt(path) / "worktrees";
    auto entry = fs::directory_iterator(trees, error);
    for (; !error && entry != fs::directory_iterator(); entry.increment(error))
    {
        for (const char *const file :
             {"HEAD", "rebase-merge/head-name", "rebase-apply/head-name", "BISECT_START"})
        {
            const std::string name = readReference(entry->path() / file);
            // A bisection has the short name.
            branches.insert(isIn(branchesFolder, name) ? name : std::string(branchesFolder) + name);
        }
    }
    refuseUnreadable(trees, error.value());
    return branches;
}

std::string findCurrent(const std::string &path)
{
    return readReference(repositoryAt(path) / "HEAD");
}

} // namespace vclink::git
