// SPDX-License-Identifier: MIT
#include "namedPaths.hpp"

#include <algorithm>
#include <system_error>
#include <utility>

#include "links.hpp"
#include "names.hpp"
#include "renames.hpp"
#include "workingCopy.hpp"

namespace vclink::shell
{
namespace
{

namespace fs = std::filesystem;

/// The states of a path and of what lies below it.
FileStateMap pick(const FileStateMap &states, const upath &path)
{
    FileStateMap picked;
    for (auto entry = states.lower_bound(path); entry != states.end(); ++entry)
    {
        const ustring &name = entry->first.string();
        if (!liesIn(name, path.string()))
        {
            break;
        }
        picked.insert(picked.end(), *entry);
    }
    return picked;
}

/// Adds the state of the entry itself, which a folder also has if it is in the place of a file, and
/// the states below a folder that is gone.
void lookUpEntry(CMAdapter &adapter, const FileStateMap &states, NamedPath &named)
{
    const upath &path = named.path;
    if (!liesIn(path.string(), adapter.getRootFolder().string()))
    {
        named.states.clear();
        return;
    }
    named.states = pick(named.states, path);
    if (!named.states.empty() && states.count(path) == 0)
    {
        return;
    }
    named.states = pick(states, path);
    named.isFolder = !named.states.empty() &&
                     named.states.begin()->first.string() != path.string() &&
                     named.states.begin()->first.string() != path.string() + u'/';
}

NamedPath lookUpFolder(CMAdapter &adapter, const std::string &argument, const fs::path &path)
{
    NamedPath named{argument, makePath(path), {}, false, false};
    std::error_code ignored;
    if (fs::is_directory(path, ignored))
    {
        named.states = folderStates(adapter, named.path);
        named.isFolder = !named.states.empty();
    }
    return named;
}

/// The link as Git knows it, and the files that were below this name before it became a link.
NamedPath lookUpLink(CMAdapter &adapter, const std::string &argument, const upath &entry)
{
    FileStateMap states = pick(folderStates(adapter, adapter.getRootFolder()), entry);
    const bool isFolder = !states.empty() && states.rbegin()->first.string() != entry.string();
    return {argument, entry, std::move(states), isFolder, true};
}

} // namespace

FileStateMap statesOf(CMAdapter &adapter, const std::vector<upath> &files)
{
    constexpr std::size_t mostNames = 10;
    if (files.size() <= mostNames)
    {
        return fileStates(adapter, files);
    }
    const FileStateMap all = folderStates(adapter, adapter.getRootFolder());
    FileStateMap states;
    std::vector<upath> others;
    for (const upath &file : files)
    {
        FileStateMap found = pick(all, file);
        if (!found.empty())
        {
            states.merge(found);
        }
        else
        {
            others.push_back(file);
        }
    }
    FileStateMap asked = fileStates(adapter, others);
    states.merge(asked);
    return states;
}

std::vector<NamedPath> lookUpFolders(CMAdapter &adapter, const std::vector<std::string> &arguments)
{
    std::vector<NamedPath> paths;
    paths.reserve(arguments.size());
    for (const std::string &argument : arguments)
    {
        paths.push_back(lookUpFolder(adapter, argument, resolveArgument(argument)));
    }
    return paths;
}

std::vector<NamedPath> lookUp(CMAdapter &adapter, const std::vector<std::string> &arguments)
{
    refuseUnreadableHead(adapter);
    const upath &root = adapter.getRootFolder();
    std::vector<NamedPath> paths;
    paths.reserve(arguments.size());
    std::vector<upath> entries;
    for (const std::string &argument : arguments)
    {
        const upath entry = entryForm(resolveArgument(argument), root);
        const bool isLink = liesIn(entry.string(), root.string()) && isFollowed(entry, root);
        if (!isLink)
        {
            entries.push_back(entry);
        }
        paths.push_back(isLink ? lookUpLink(adapter, argument, entry)
                               : lookUpFolder(adapter, argument, nativePath(entry)));
    }
    const FileStateMap states = statesOf(adapter, entries);
    for (NamedPath &named : paths)
    {
        if (!named.isLink)
        {
            lookUpEntry(adapter, states, named);
        }
    }
    if (std::any_of(paths.begin(), paths.end(),
                    [](const NamedPath &named) { return named.states.empty(); }))
    {
        refuseUnknownStates(adapter);
    }
    return paths;
}

bool isAddressable(const upath &path, const upath &root)
{
    return relativeName(path, root).find(u'\\') == ustring::npos;
}

bool meansAllBelow(const ustring &name)
{
    constexpr std::u16string_view special = u"*?[\\";
    const bool isOdd = name.empty() || name.front() == u'#' || name.front() == u'!';
    return !isOdd &&
           std::none_of(name.begin(), name.end(),
                        [special](char16_t unit) {
                            return (unit < 0x20) || special.find(unit) != std::u16string_view::npos;
                        }) &&
           name.back() != u' ';
}

FileStateMap filter(const FileStateMap &states,
                    const std::function<bool(FileState::State)> &isMeant)
{
    FileStateMap meant;
    for (const auto &entry : states)
    {
        if (isMeant(entry.second.getState()))
        {
            meant.insert(meant.end(), entry);
        }
    }
    return meant;
}

std::string listNames(const FileStateMap &states)
{
    std::string names;
    const ustring folder = states.empty() ? ustring() : makePath(currentFolder()).string();
    for (const auto &[path, state] : states)
    {
        names += "\n  " + quoteName(wayTo(path, folder));
    }
    return names;
}

bool isPattern(const ustring &name)
{
    return name.find_first_of(u"*?[") != ustring::npos;
}

std::vector<upath> literalNames(const std::vector<upath> &files, const upath &root)
{
    std::vector<upath> names;
    names.reserve(files.size());
    for (const upath &file : files)
    {
        const ustring name = relativeName(file, root);
        ustring literal = root.string() + u'/';
        for (const char16_t unit : name)
        {
            literal += isPattern(ustring(1, unit)) ? ustring{u'[', unit, u']'} : ustring(1, unit);
        }
        std::error_code ignored;
        const bool isTaken = fs::exists(fs::symlink_status(nativePath(upath(literal)), ignored));
        names.push_back(isPattern(name) && !isTaken ? upath(literal) : file);
    }
    return names;
}

std::vector<upath> addressable(const FileStateMap &states, const upath &root)
{
    std::vector<upath> paths;
    paths.reserve(states.size());
    for (const auto &[path, state] : states)
    {
        if (isAddressable(path, root))
        {
            paths.push_back(path);
        }
    }
    return paths;
}

} // namespace vclink::shell
