// SPDX-License-Identifier: MIT
#include "util/path/paths.hpp"

#include <algorithm>
#include <climits>
#include <cstdint>
#include <cstring>
#include <string_view>

#include <boost/filesystem/exception.hpp>
#include <boost/filesystem/operations.hpp>

#include "error/errorUtil/gitString.hpp"
#include "fl/filesystem/detail/path_text.hpp"
#include "fl/i18n/convert.hpp"

namespace vclink::git
{
namespace
{

namespace fs = boost::filesystem;

bool isName(std::string_view element)
{
    return !element.empty() && element != "." && element != "..";
}

bool hasWorkingFolder()
{
    boost::system::error_code error;
    fs::current_path(error);
    return !error;
}

/// Returns what boost::filesystem::weakly_canonical returns for an absolute path.
fs::path resolveFromRoot(const fs::path &path)
{
    fs::path existing = path;
    fs::path missing;
    while (existing.has_relative_path() && !fs::exists(existing))
    {
        missing = missing.empty() ? existing.filename() : existing.filename() / missing;
        existing = existing.parent_path();
    }
    existing = fs::canonical(existing, existing.root_path());
    return missing.empty() ? existing : (existing / missing).lexically_normal();
}

/// Returns true if not even the first element of a relative path exists.
bool isMissingRelative(const fs::path &path)
{
    boost::system::error_code error;
    return path.is_relative() &&
           (path.empty() || fs::status(*path.begin(), error).type() == fs::file_not_found);
}

/// Boost reads the working folder even if the path is absolute, and fails if that folder does not
/// exist.
fs::path weaklyCanonical(const fs::path &path)
{
    // Boost 1.74 leaves such a path as it is, 1.88 looks for it in the working folder.
    if (isMissingRelative(path))
    {
        return path.lexically_normal();
    }
    try
    {
        return fs::weakly_canonical(path);
    }
    catch (const fs::filesystem_error &)
    {
        if (!path.is_absolute() || hasWorkingFolder())
        {
            throw;
        }
    }
    return resolveFromRoot(path);
}

/// Handles a separator at the end as Boost 1.74 does, with every release: it is removed if the path
/// exists, otherwise "." is appended. Boost 1.81 keeps it.
fs::path canonical(const fs::path &path)
{
    fs::path result = weaklyCanonical(path);
    const std::string &text = result.native();
    if (text.size() < 2 || text.back() != '/')
    {
        return result;
    }
    boost::system::error_code ignored;
    return fs::exists(path, ignored) ? fs::path(text.substr(0, text.size() - 1)) : result / ".";
}

/// A path split into a folder without "." and "..", and a name in it, which can be resolved one
/// after the other. Has no folder if the path cannot be split.
struct NameInFolder
{
    std::string_view folder;
    std::string_view name;
};

NameInFolder cut(std::string_view path)
{
    const std::size_t slash = path.rfind('/');
    // Longer than the system allows: refused completely, not resolved element by element.
    const bool isTooLong = path.size() >= PATH_MAX;
    if (isTooLong || slash == std::string_view::npos || slash == 0 ||
        !isName(path.substr(slash + 1)))
    {
        return {};
    }
    const std::string_view folder = path.substr(0, slash);
    for (std::size_t begin = folder.front() == '/' ? 1 : 0; begin <= folder.size();)
    {
        const std::size_t end = std::min(folder.find('/', begin), folder.size());
        if (!isName(folder.substr(begin, end - begin)))
        {
            return {};
        }
        begin = end + 1;
    }
    return {folder, path.substr(slash + 1)};
}

bool isAscii(std::string_view text)
{
    constexpr std::uint64_t highBits = 0x8080808080808080U;
    std::uint64_t seen = 0;
    for (; text.size() >= sizeof seen; text.remove_prefix(sizeof seen))
    {
        std::uint64_t word = 0;
        std::memcpy(&word, text.data(), sizeof word);
        seen |= word;
    }
    for (const char unit : text)
    {
        seen |= static_cast<unsigned char>(unit);
    }
    return (seen & highBits) == 0;
}

/// Converts the name into `converted`. Reuses its memory if the name is ASCII, as nearly all are:
/// this runs for each file of a status walk.
void convertName(const char *name, ustring &converted)
{
    const std::string_view units(name);
    if (!isAscii(units))
    {
        converted = fl::i18n::utf8_to_ustring(name);
        return;
    }
    converted.resize(units.size());
    std::transform(units.begin(), units.end(), converted.begin(),
                   [](char unit) { return static_cast<char16_t>(unit); });
}

} // namespace

RootRelativePaths::RootRelativePaths(const upath &root)
    : given_(toGitString(root.string())), root_(canonical(given_))
{
}

std::string RootRelativePaths::relative(const upath &path)
{
    std::string text = resolve(toGitString(path.string()));
    std::replace(text.begin(), text.end(), '\\', '/');
    return text;
}

std::string RootRelativePaths::resolve(const std::string &path)
{
    const auto [folder, name] = cut(path);
    const FolderBelowRoot below =
        folder.empty() ? FolderBelowRoot() : findFolder(std::string(folder));
    if (!below || fs::is_symlink(fs::symlink_status(path)))
    {
        return canonical(path).lexically_relative(root_).string();
    }
    return (*below == "." ? std::string() : *below + '/').append(name);
}

const RootRelativePaths::FolderBelowRoot &RootRelativePaths::findFolder(const std::string &folder)
{
    const auto known = folders_.find(folder);
    if (known != folders_.end())
    {
        return known->second;
    }
    // Step by step only below the root: a path above the root cannot be below it.
    const bool isGivenBelow = folder.size() > given_.size() && folder.rfind(given_ + '/', 0) == 0;
    const std::string relative =
        isGivenBelow ? resolve(folder) : canonical(folder).lexically_relative(root_).string();
    const bool isBelow = !relative.empty() && relative != ".." && relative.rfind("../", 0) != 0;
    return folders_.emplace(folder, FolderBelowRoot(isBelow, relative)).first->second;
}

ustring relativeToRoot(const upath &root, const upath &path)
{
    return fl::i18n::utf8_to_ustring(RootRelativePaths(root).relative(path));
}

upath joinRepositoryPath(const upath &root, const char *name)
{
    ustring buffer;
    return joinRepositoryPath(root, name, buffer);
}

upath joinRepositoryPath(const upath &root, const char *name, ustring &buffer)
{
    convertName(name, buffer);
    ustring text;
    text.reserve(root.string().size() + 1 + buffer.size());
    text = root.string();
    if (!buffer.empty())
    {
        fl::filesystem::detail::concatenate_pathname(text, buffer, root.native());
    }
    return upath(std::move(text), root.native());
}

} // namespace vclink::git
