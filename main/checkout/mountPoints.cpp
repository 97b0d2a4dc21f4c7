// SPDX-License-Identifier: MIT
#include "main/checkout/mountPoints.hpp"

#include <cstddef>

#include <git2/tree.h>

#include "main/checkout/treeChanges.hpp"
#include "util/repository/objectIds.hpp"
#include "util/scope/wholeFile.hpp"

namespace vclink::git
{
namespace
{

/// Blanks, tabs, line feeds and backslashes are octal numbers of three digits in the list.
std::string unescape(std::string_view escaped)
{
    constexpr std::size_t digits = 3;
    constexpr int bitsOfADigit = 3;
    std::string text;
    for (std::size_t place = 0; place < escaped.size(); ++place)
    {
        if (escaped[place] != '\\' || place + digits >= escaped.size())
        {
            text += escaped[place];
            continue;
        }
        int code = 0;
        for (const char digit : escaped.substr(place + 1, digits))
        {
            code = (code << bitsOfADigit) + (digit - '0');
        }
        text += static_cast<char>(code);
        place += digits;
    }
    return text;
}

std::string_view fieldOf(std::string_view line, int number)
{
    for (; number > 0; --number)
    {
        const std::size_t blank = line.find(' ');
        line.remove_prefix(blank == std::string_view::npos ? line.size() : blank + 1);
    }
    return line.substr(0, line.find(' '));
}

/// Returns true if the checkout leaves what is at the name, or only writes below it.
bool stays(const git_tree_entry *before, const git_tree_entry *after)
{
    if (before == nullptr || after == nullptr)
    {
        return before == nullptr && (after == nullptr || isTree(after));
    }
    return (isTree(before) && isTree(after)) ||
           (isSameId(*git_tree_entry_id(before), *git_tree_entry_id(after)) &&
            git_tree_entry_filemode(before) == git_tree_entry_filemode(after));
}

} // namespace

std::vector<std::string> findMountPointsBelow(std::string_view mounts, const std::string &root)
{
    constexpr int placeOfMount = 4;
    std::vector<std::string> found;
    while (!mounts.empty())
    {
        const std::string_view line = mounts.substr(0, mounts.find('\n'));
        mounts.remove_prefix(line.size() < mounts.size() ? line.size() + 1 : line.size());
        const std::string path = unescape(fieldOf(line, placeOfMount));
        if (path.size() > root.size() && path.compare(0, root.size(), root) == 0)
        {
            found.push_back(path.substr(root.size()));
        }
    }
    return found;
}

std::vector<std::string> mountPointsBelow(const std::string &root)
{
    // Without /proc, nothing is known.
    std::string mounts;
    const bool isRead = readWholeFile("/proc/self/mountinfo", mounts) == 0;
    return isRead ? findMountPointsBelow(mounts, root) : std::vector<std::string>();
}

Obstacle mountedAt(const std::string &name)
{
    return {name, "'" + name + "' is a mount point, which the checkout would change or remove"};
}

Finding findMountPoint(const std::vector<std::string> &mounts, const git_tree *before,
                       const git_tree *after)
{
    for (const std::string &name : mounts)
    {
        const OwnedTreeEntry old = findInTree(before, name);
        const OwnedTreeEntry coming = findInTree(after, name);
        if (!stays(old.get(), coming.get()))
        {
            return mountedAt(name);
        }
    }
    return {};
}

} // namespace vclink::git
