// SPDX-License-Identifier: MIT
#include "refspecPatterns.hpp"

#include <algorithm>
#include <string_view>

namespace vclink::shell
{
namespace
{

/// The two sides of a refspec without its plus; they are the same if there is no colon.
struct Sides
{
    std::string source;
    std::string target;
};

Sides split(const std::string &text)
{
    const std::size_t colon = text.find(':');
    const std::string source = text.substr(0, colon);
    return {source, colon == std::string::npos ? source : text.substr(colon + 1)};
}

/// The branches that both sides have.
std::vector<std::string> findMatching(const std::vector<std::string> &references,
                                      const AskHeads &askHeads)
{
    std::vector<std::string> names;
    for (const git::GitRemoteHead &head : askHeads())
    {
        const bool isBranch = head.name.rfind("refs/heads/", 0) == 0;
        if (isBranch &&
            std::find(references.begin(), references.end(), head.name) != references.end())
        {
            names.push_back(head.name);
        }
    }
    return names;
}

/// The refspecs for the references that a pattern matches.
std::vector<std::string> findMatches(const Sides &sides, const std::vector<std::string> &references)
{
    std::vector<std::string> refspecs;
    for (const std::string &reference : references)
    {
        const auto target = mapReference(sides.source, sides.target, reference);
        if (target)
        {
            refspecs.push_back(reference + ':' + *target);
        }
    }
    return refspecs;
}

} // namespace

std::optional<std::string> mapReference(const std::string &from, const std::string &to,
                                        const std::string &name)
{
    const std::size_t star = from.find('*');
    if (star == std::string::npos)
    {
        return from == name ? std::optional(to) : std::nullopt;
    }
    const std::string_view end = std::string_view(from).substr(star + 1);
    const bool matches = name.size() + 1 >= from.size() &&
                         name.compare(0, star, from, 0, star) == 0 &&
                         name.compare(name.size() - end.size(), end.size(), end) == 0;
    const std::size_t place = to.find('*');
    if (!matches || place == std::string::npos)
    {
        return std::nullopt;
    }
    return to.substr(0, place) + name.substr(star, name.size() + 1 - from.size()) +
           to.substr(place + 1);
}

std::vector<std::string> expandPush(const std::vector<std::string> &configured,
                                    const std::vector<std::string> &references,
                                    const AskHeads &askHeads)
{
    std::vector<std::string> refspecs;
    for (const std::string &text : configured)
    {
        const std::string plus = text.rfind('+', 0) == 0 ? "+" : "";
        const std::string rest = text.substr(plus.size());
        std::vector<std::string> found{rest};
        if (rest == ":")
        {
            found = findMatching(references, askHeads);
        }
        else if (rest.find('*') != std::string::npos)
        {
            found = findMatches(split(rest), references);
        }
        for (const std::string &refspec : found)
        {
            refspecs.push_back(plus + refspec);
        }
    }
    return refspecs;
}

} // namespace vclink::shell
