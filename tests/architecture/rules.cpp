// SPDX-License-Identifier: MIT
#include "rules.hpp"

#include <algorithm>
#include <map>
#include <set>
#include <sstream>
#include <utility>

#include "support/strings.hpp"

namespace vclink::test
{
namespace
{

const std::map<std::string, std::set<std::string>> &allowedLayers()
{
    static const std::map<std::string, std::set<std::string>> allowed{
        {"host", {"host"}},
        {"include", {"host", "include"}},
        {"error", {"host", "include", "error"}},
        {"util", {"host", "include", "error", "util"}},
        {"options", {"host", "include", "error", "options"}},
        {"main", {"host", "include", "error", "util", "options", "main"}},
        {"examples", {"host", "include", "examples"}}};
    return allowed;
}

struct Room
{
    std::string folder;
    std::set<std::string> below;
};

/// From the bottom up. A room includes rooms that come before it only, so that there is no circle.
const std::vector<Room> &rooms()
{
    static const std::vector<Room> table{
        {"error/logging", {}},
        {"error/errorUtil", {"error/logging"}},
        {"error", {"error/logging"}},
        {"options", {}},
        {"util/path", {}},
        {"util/scope", {}},
        {"util/repository", {"util/path", "util/scope"}},
        {"util/lock", {"util/repository", "util/scope"}},
        {"util/command", {"util/scope"}},
        {"util", {"util/command", "util/scope"}},
        {"main/mergeState", {}},
        {"main/checkout", {"main/mergeState"}},
        {"main/files", {"main/checkout", "main/mergeState"}},
        {"main/merge", {"main/checkout", "main/files", "main/mergeState"}},
        {"main/remote", {"main/files"}},
        {"main", {"main/checkout", "main/files", "main/merge", "main/mergeState", "main/remote"}}};
    return table;
}

std::vector<Room>::const_iterator findRoom(const std::string &folder)
{
    return std::find_if(rooms().begin(), rooms().end(),
                        [&](const Room &room) { return room.folder == folder; });
}

std::string folderOf(const std::string &file)
{
    return file.substr(0, file.rfind('/'));
}

bool mayInclude(std::vector<Room>::const_iterator room, const std::string &folder)
{
    return room->folder == folder || (room->below.count(folder) != 0 && findRoom(folder) < room);
}

/// What a file includes of its own layer, each with its folder.
std::map<std::string, std::string> includedOfLayer(const SourceTree &tree, const std::string &file)
{
    std::map<std::string, std::string> targets;
    for (const auto &name : findIncludes(tree.at(file)))
    {
        const auto target = resolveInclude(tree, file, name);
        if (!target.empty() && layerOf(target) == layerOf(file))
            targets.emplace(target, folderOf(target));
    }
    return targets;
}

bool hasRooms(const std::string &file)
{
    static const std::set<std::string> layers{"error", "util", "options", "main"};
    return layers.count(layerOf(file)) != 0;
}

bool isOfLibrary(const std::string &file)
{
    static const std::set<std::string> layers{"include", "error", "util", "options", "main"};
    return layers.count(layerOf(file)) != 0;
}

std::string included(const std::string &file, const std::string &name)
{
    return file + " includes " + name;
}

bool isStandardHeader(const std::string &name)
{
    return name.find_first_of("./") == std::string::npos;
}

/// The library of Boost that a header belongs to, or an empty text.
std::string boostLibrary(const std::string &name)
{
    const std::string boost = "boost/";
    if (!startsWith(name, boost))
        return {};
    return name.substr(boost.size(), name.find_first_of("/.", boost.size()) - boost.size());
}

std::string firstLineOfCode(const std::string &content)
{
    std::istringstream lines(content);
    for (std::string line; std::getline(lines, line);)
    {
        if (!line.empty() && !startsWith(line, "//"))
            return line;
    }
    return {};
}

/// The tests of a folder stand outside the rules for what ships.
bool isShipped(const std::string &file)
{
    return (isOfLibrary(file) || layerOf(file) == "host") && !startsWith(file, "host/tests/");
}

} // namespace

Findings findBrokenLayers(const SourceTree &tree)
{
    Findings findings;
    for (const auto &[file, content] : tree)
    {
        const auto allowed = allowedLayers().find(layerOf(file));
        if (allowed == allowedLayers().end() || startsWith(file, "host/tests/"))
            continue;
        for (const auto &name : findIncludes(content))
        {
            const auto target = resolveInclude(tree, file, name);
            if (!target.empty() && allowed->second.count(layerOf(target)) == 0)
                findings.push_back(included(file, target));
        }
    }
    return findings;
}

Findings findBrokenRooms(const SourceTree &tree)
{
    Findings findings;
    for (const auto &entry : tree)
    {
        const std::string &file = entry.first;
        if (!hasRooms(file))
            continue;
        const auto room = findRoom(folderOf(file));
        if (room == rooms().end())
        {
            findings.push_back(file + " is in a folder that is no room");
            continue;
        }
        for (const auto &[target, folder] : includedOfLayer(tree, file))
        {
            if (!mayInclude(room, folder))
                findings.push_back(included(file, target));
        }
    }
    return findings;
}

Findings findUnusedArrows(const SourceTree &tree)
{
    std::set<std::pair<std::string, std::string>> used;
    for (const auto &entry : tree)
    {
        const std::string &file = entry.first;
        if (!hasRooms(file))
            continue;
        for (const auto &[target, folder] : includedOfLayer(tree, file))
            used.emplace(folderOf(file), folder);
    }
    Findings findings;
    for (const auto &room : rooms())
    {
        for (const auto &folder : room.below)
        {
            if (used.count({room.folder, folder}) == 0)
                findings.push_back(room.folder + " includes nothing of " + folder);
        }
    }
    return findings;
}

Findings findForeignIncludesOfExportedHeaders(const SourceTree &tree)
{
    static const std::set<std::string> values{"none", "none_t", "optional", "variant"};
    Findings findings;
    for (const auto &[file, content] : tree)
    {
        if (layerOf(file) != "include")
            continue;
        for (const auto &name : findIncludes(content))
        {
            const bool ofTree = !resolveInclude(tree, file, name).empty();
            if (!ofTree && !isStandardHeader(name) && values.count(boostLibrary(name)) == 0)
                findings.push_back(included(file, name));
        }
    }
    return findings;
}

Findings findUseOfHostControls(const SourceTree &tree)
{
    const std::string controls = "vclink_host/";
    Findings findings;
    for (const auto &[file, content] : tree)
    {
        const bool ofSdk =
            startsWith(file, "host/include/") && !startsWith(file, "host/include/" + controls);
        if (!ofSdk && !isOfLibrary(file))
            continue;
        for (const auto &name : findIncludes(content))
        {
            const bool allowed = ofSdk && name == controls + "export.hpp";
            if (startsWith(name, controls) && !allowed)
                findings.push_back(included(file, name));
        }
    }
    return findings;
}

Findings findSpreadHeavyLibraries(const SourceTree &tree)
{
    Findings findings;
    static const std::set<std::string> heavy{"log", "process", "stacktrace"};
    std::map<std::string, std::string> homes;
    for (const auto &[file, content] : tree)
    {
        if (!isShipped(file))
            continue;
        for (const auto &name : findIncludes(content))
        {
            const auto library = boostLibrary(name);
            if (heavy.count(library) == 0)
                continue;
            const auto home = homes.emplace(library, file).first->second;
            if (isHeader(file))
                findings.push_back(included(file, name) + ", and is a header");
            else if (home != file)
                findings.push_back(included(file, name) + ", and so does " + home);
        }
    }
    return findings;
}

Findings findHeadersWithoutProlog(const SourceTree &tree)
{
    Findings findings;
    for (const auto &[file, content] : tree)
    {
        if (!isHeader(file))
            continue;
        if (!startsWith(content, "// SPDX-License-Identifier: MIT\n"))
            findings.push_back(file + " does not begin with its SPDX line");
        if (firstLineOfCode(content) != "#pragma once")
            findings.push_back(file + " has code before #pragma once");
    }
    return findings;
}

Findings findLineMacros(const SourceTree &tree)
{
    Findings findings;
    for (const auto &[file, content] : tree)
    {
        if (isOfLibrary(file) && content.find("__LINE__") != std::string::npos)
            findings.push_back(file + " uses __LINE__");
    }
    return findings;
}

Findings findFileStreams(const SourceTree &tree)
{
    Findings findings;
    for (const auto &[file, content] : tree)
    {
        const auto names = findIncludes(content);
        if (isOfLibrary(file) && std::find(names.begin(), names.end(), "fstream") != names.end())
            findings.push_back(included(file, "fstream"));
    }
    return findings;
}

Findings findLongFiles(const SourceTree &tree)
{
    constexpr auto limit = 400;
    Findings findings;
    for (const auto &[file, content] : tree)
    {
        const auto lines = std::count(content.begin(), content.end(), '\n');
        if (lines >= limit)
            findings.push_back(file + " has " + std::to_string(lines) + " lines");
    }
    return findings;
}

} // namespace vclink::test
