// SPDX-License-Identifier: MIT
#include "main/remote/Refspec.hpp"

#include <algorithm>
#include <cstddef>
#include <iterator>

#include <git2/refspec.h>
#include <git2/remote.h>

namespace vclink::git
{
namespace
{

constexpr std::string_view allReferences = "refs/";

/// Completes the name of a reference that a fetch writes.
std::string completeTarget(std::string_view name)
{
    std::string_view folder;
    if (!name.empty() && !isIn(allReferences, name))
    {
        folder = isIn("remotes/", name) ? allReferences : branchesFolder;
    }
    return std::string(folder).append(name);
}

} // namespace

bool isIn(std::string_view folder, std::string_view reference) noexcept
{
    return reference.substr(0, folder.size()) == folder;
}

bool Refspec::isPattern() const noexcept
{
    return target.find('*') != std::string::npos;
}

bool Refspec::isNegative() const noexcept
{
    return isIn("^", source);
}

bool Refspec::canReach(std::string_view folder) const noexcept
{
    const std::string_view fixed = std::string_view(target).substr(0, target.find('*'));
    return isIn(folder, fixed) || (isPattern() && isIn(fixed, folder));
}

std::optional<std::string> Refspec::findTarget(const std::string &reference) const
{
    const std::size_t star = source.find('*');
    if (star == std::string::npos || !isPattern())
    {
        return reference == source ? std::optional(target) : std::nullopt;
    }
    const std::string_view name = reference;
    const std::string_view end = std::string_view(source).substr(star + 1);
    const bool matches = name.size() + 1 >= source.size() &&
                         name.substr(0, star) == source.substr(0, star) &&
                         name.substr(name.size() - end.size()) == end;
    if (!matches)
    {
        return std::nullopt;
    }
    const std::size_t place = target.find('*');
    return target.substr(0, place)
        .append(name.substr(star, name.size() - star - end.size()))
        .append(target.substr(place + 1));
}

Refspec readRefspec(std::string_view text, git_direction direction)
{
    Refspec refspec;
    refspec.isForced = isIn("+", text);
    text.remove_prefix(refspec.isForced ? 1 : 0);
    const std::size_t colon = text.rfind(':');
    refspec.source = text.substr(0, colon);
    if (colon != std::string_view::npos)
    {
        refspec.target = text.substr(colon + 1);
    }
    else if (direction == GIT_DIRECTION_PUSH)
    {
        refspec.target = refspec.source;
    }
    if (direction == GIT_DIRECTION_FETCH)
    {
        refspec.target = completeTarget(refspec.target);
    }
    return refspec;
}

std::vector<Refspec> readConfiguredRefspecs(const git_remote *remote, git_direction direction)
{
    std::vector<Refspec> refspecs;
    const std::size_t count = git_remote_refspec_count(remote);
    for (std::size_t place = 0; place < count; ++place)
    {
        const git_refspec *const refspec = git_remote_get_refspec(remote, place);
        if (git_refspec_direction(refspec) == direction)
        {
            refspecs.push_back(readRefspec(git_refspec_string(refspec), direction));
        }
    }
    return refspecs;
}

std::vector<Refspec> readEffectiveRefspecs(const git_remote *remote, const git_strarray &given,
                                           git_direction direction)
{
    if (given.count == 0)
    {
        return readConfiguredRefspecs(remote, direction);
    }
    std::vector<Refspec> refspecs;
    refspecs.reserve(given.count);
    std::transform(given.strings, given.strings + given.count, std::back_inserter(refspecs),
                   [direction](const char *text) { return readRefspec(text, direction); });
    return refspecs;
}

} // namespace vclink::git
