// SPDX-License-Identifier: MIT
#include "rules.hpp"

#include <map>
#include <set>
#include <sstream>
#include <utility>

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

bool isOfLibrary(const std::string &file)
{
    static const std::set<std::string> layers{"include", "error", "util", "options", "main"};
    return layers.count(layerOf(file)) != 0;
}

bool startsWith(const std::string &text, const std::string &beginning)
{
    return text.compare(0, beginning.size(), beginning) == 0;
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

} // namespace vclink::test
