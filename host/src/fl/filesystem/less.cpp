// SPDX-License-Identifier: MIT
#include <algorithm>
#include <cstdint>
#include <cstring>
#include <string_view>

#include "fl/filesystem/path.hpp"

namespace fl::filesystem::detail
{
namespace
{

constexpr char16_t slash = u'/';

/// Where the texts first differ, at most the length of the shorter one. Eight bytes a step: this is
/// most of what an insertion into a map of a repository's paths costs.
std::size_t findDifference(std::u16string_view left, std::u16string_view right) noexcept
{
    constexpr std::size_t step = sizeof(std::uint64_t) / sizeof(char16_t);
    const std::size_t end = std::min(left.size(), right.size());
    std::size_t position = 0;
    for (; position + step <= end; position += step)
    {
        std::uint64_t leftUnits = 0;
        std::uint64_t rightUnits = 0;
        std::memcpy(&leftUnits, left.data() + position, sizeof leftUnits);
        std::memcpy(&rightUnits, right.data() + position, sizeof rightUnits);
        if (leftUnits != rightUnits)
        {
            break;
        }
    }
    while (position < end && left[position] == right[position])
    {
        ++position;
    }
    return position;
}

bool endsElement(std::u16string_view path, std::size_t position) noexcept
{
    return position == path.size() || path[position] == slash;
}

/// Whether a name comes at the position or behind it.
bool hasName(std::u16string_view path, std::size_t position) noexcept
{
    return path.find_first_not_of(slash, position) != std::u16string_view::npos;
}

/// Takes the next name off the path; empty when there is none.
std::u16string_view takeName(std::u16string_view &path) noexcept
{
    path.remove_prefix(std::min(path.find_first_not_of(slash), path.size()));
    const std::u16string_view name = path.substr(0, path.find(slash));
    path.remove_prefix(name.size());
    return name;
}

bool lessByNames(std::u16string_view left, std::u16string_view right) noexcept
{
    for (;;)
    {
        const std::u16string_view leftName = takeName(left);
        const std::u16string_view rightName = takeName(right);
        // An empty name is the end of a path, and compares as less than any other.
        const int order = leftName.compare(rightName);
        if (order != 0 || leftName.empty())
        {
            return order < 0;
        }
    }
}

bool lessByElements(std::u16string_view left, std::u16string_view right) noexcept
{
    const bool leftIsRooted = !left.empty() && left.front() == slash;
    const bool rightIsRooted = !right.empty() && right.front() == slash;
    if (leftIsRooted == rightIsRooted)
    {
        return lessByNames(left, right);
    }
    // The root is an element like others, "/", and a name never begins with a slash.
    return leftIsRooted ? !right.empty() && slash < right.front()
                        : left.empty() || left.front() < slash;
}

} // namespace

bool less(const ustring &left, const ustring &right) noexcept
{
    const std::u16string_view leftPath = left;
    const std::u16string_view rightPath = right;
    const std::size_t difference = findDifference(leftPath, rightPath);
    const bool leftEnds = endsElement(leftPath, difference);
    const bool rightEnds = endsElement(rightPath, difference);
    if (!leftEnds && !rightEnds)
    {
        return leftPath[difference] < rightPath[difference];
    }
    if (difference > 0 && leftPath[difference - 1] != slash)
    {
        // The same name up to here. Where it ends in one path only, that path is less; where it
        // ends in both, one of them has nothing left.
        return leftEnds != rightEnds ? leftEnds : hasName(rightPath, difference);
    }
    // Behind a common root only names are left.
    return difference == 0 ? lessByElements(leftPath, rightPath)
                           : lessByNames(leftPath.substr(difference), rightPath.substr(difference));
}

} // namespace fl::filesystem::detail
