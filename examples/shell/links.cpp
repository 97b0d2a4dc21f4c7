// SPDX-License-Identifier: MIT
#include "links.hpp"

#include <algorithm>
#include <string_view>
#include <system_error>

#include "namedPaths.hpp"
#include "names.hpp"

namespace vclink::shell
{
namespace
{

namespace fs = std::filesystem;

bool leadsSomewhere(const fs::path &path)
{
    std::error_code ignored;
    return fs::is_symlink(fs::symlink_status(path, ignored)) &&
           fs::status(path, ignored).type() != fs::file_type::not_found;
}

/// The uppermost link below the root that would be followed; empty when there is none.
fs::path findLink(const upath &entry, const upath &root)
{
    fs::path path = nativePath(root);
    for (const fs::path &element : nativePath(upath(relativeName(entry, root))))
    {
        path /= element;
        if (leadsSomewhere(path))
        {
            return path;
        }
    }
    return {};
}

fs::path resolved(const fs::path &path)
{
    return nativePath(canonicalForm(makePath(path)));
}

/// Characters that mean themselves within brackets.
bool isPlain(char character)
{
    constexpr std::string_view plain =
        "abcdefghijklmnopqrstuvwxyzABCDEFGHIJKLMNOPQRSTUVWXYZ0123456789._";
    return plain.find(character) != std::string_view::npos;
}

} // namespace

upath entryForm(const fs::path &path, const upath &root)
{
    fs::path form;
    for (const fs::path &element : path)
    {
        if (element == "..")
        {
            form = resolved(form).parent_path();
        }
        else if (element != "." && !element.empty())
        {
            form /= element;
            if (!liesIn(makePath(form).string(), root.string()))
            {
                form = resolved(form);
            }
        }
    }
    return makePath(form);
}

bool isFollowed(const upath &entry, const upath &root)
{
    return !findLink(entry, root).empty();
}

FileStateMap filterFollowed(const FileStateMap &states, const upath &root, bool areFollowed)
{
    FileStateMap found;
    // Most files lie in the same folder as the one before.
    fs::path folderWithoutLinks;
    for (const auto &entry : states)
    {
        const fs::path path = nativePath(entry.first);
        const bool isFolderKnown = path.parent_path() == folderWithoutLinks;
        const bool isOne = isFolderKnown ? leadsSomewhere(path) : isFollowed(entry.first, root);
        if (!isOne)
        {
            folderWithoutLinks = path.parent_path();
        }
        if (isOne == areFollowed)
        {
            found.insert(found.end(), entry);
        }
    }
    return found;
}

std::optional<upath> patternForEntry(const upath &entry, const upath &root)
{
    const fs::path link = findLink(entry, root);
    std::string name = link.filename().string();
    const auto plain = std::find_if(name.begin(), name.end(), isPlain);
    if (plain == name.end() || !meansAllBelow(relativeName(entry, root)))
    {
        return std::nullopt;
    }
    const auto index = static_cast<std::size_t>(plain - name.begin());
    name = name.substr(0, index) + '[' + name[index] + ']' + name.substr(index + 1);
    const fs::path pattern = link.parent_path() / name;
    if (fs::exists(fs::symlink_status(pattern)))
    {
        return std::nullopt;
    }
    return makePath(pattern.string() + nativePath(entry).string().substr(link.string().size()));
}

} // namespace vclink::shell
