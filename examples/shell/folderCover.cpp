// SPDX-License-Identifier: MIT
#include "folderCover.hpp"

#include <algorithm>
#include <filesystem>
#include <map>
#include <string_view>

#include "links.hpp"
#include "names.hpp"

namespace vclink::shell
{
namespace
{

upath inRoot(const upath &root, const ustring &name)
{
    return upath(root.string() + u'/' + name);
}

/// The names of the files that the back end can get.
std::vector<upath> nameFiles(const FileStateMap &files, const upath &root, LinkNames links)
{
    std::vector<upath> names = addressable(filterFollowed(files, root, false), root);
    if (links == LinkNames::Patterns)
    {
        for (const auto &[path, state] : filterFollowed(files, root, true))
        {
            if (const auto pattern = patternForEntry(path, root))
            {
                names.push_back(*pattern);
            }
        }
    }
    return names;
}

/// The root has no name, its content has. A renamed file has its old name in the states.
std::vector<upath> coverRoot(const upath &root, const FileStateMap &meant, LinkNames links)
{
    std::map<ustring, FileStateMap> groups;
    for (const auto &entry : meant)
    {
        const ustring name = relativeName(entry.first, root);
        groups[name.substr(0, name.find(u'/'))].insert(entry);
    }
    for (const auto &entry : std::filesystem::directory_iterator(nativePath(root)))
    {
        const ustring name = makePath(entry.path().filename()).string();
        const upath path = inRoot(root, name);
        if (name != u".git" && meansAllBelow(name))
        {
            FileStateMap &group = groups[name];
            if (isFollowed(path, root))
            {
                group.emplace(path, FileState::Unknown);
            }
        }
    }
    std::vector<upath> paths;
    for (const auto &[name, states] : groups)
    {
        const upath path = inRoot(root, name);
        if (meansAllBelow(name) && !isFollowed(path, root))
        {
            paths.push_back(path);
        }
        else
        {
            const std::vector<upath> files = nameFiles(states, root, links);
            paths.insert(paths.end(), files.begin(), files.end());
        }
    }
    return paths;
}

std::vector<upath> coverFolder(const upath &root, const NamedPath &folder,
                               const FileStateMap &meant, LinkNames links)
{
    if (meant.empty())
    {
        return {};
    }
    const bool isInTheWay =
        links == LinkNames::None && !filterFollowed(folder.states, root, true).empty();
    if (folder.isLink || isInTheWay)
    {
        return nameFiles(meant, root, links);
    }
    if (folder.path.string() == root.string())
    {
        return coverRoot(root, meant, links);
    }
    return meansAllBelow(relativeName(folder.path, root)) ? std::vector<upath>{folder.path}
                                                          : nameFiles(meant, root, links);
}

} // namespace

Cover cover(const upath &root, const std::vector<NamedPath> &paths,
            const std::function<bool(FileState::State)> &isMeant, LinkNames links)
{
    Cover cover;
    for (const NamedPath &named : paths)
    {
        FileStateMap meant = filter(named.states, isMeant);
        const std::vector<upath> list = named.isFolder || named.isLink
                                            ? coverFolder(root, named, meant, links)
                                            : std::vector<upath>{named.path};
        cover.list.insert(cover.list.end(), list.begin(), list.end());
        cover.files.merge(meant);
    }
    return cover;
}

} // namespace vclink::shell
