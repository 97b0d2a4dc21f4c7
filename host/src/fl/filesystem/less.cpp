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

/// Returns the first difference of the texts, at most the length of the shorter one. Compares eight
/// bytes at a time, because this is most of the cost of an insertion into a map of paths.
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

/// Returns true if a name begins at the position or after it.
bool hasName(std::u16string_view path, std::size_t position) noexcept
{
    return path.find_first_not_of(slash, position) != std::u16string_view::npos;
}

/// Removes the next name from the path and returns it. Empty if there is none.
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
        // An empty name is the end of a path, and is less than any other.
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
    // The root "/" is an element like others, and a name never begins with a slash.
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
        // The names are equal up to here. If the name ends in only one path, that path is less; if
        // it ends in both, one of the paths has ended.
        return leftEnds != rightEnds ? leftEnds : hasName(rightPath, difference);
    }
    // After a common root only names are left.
    return difference == 0 ? lessByElements(leftPath, rightPath)
                           : lessByNames(leftPath.substr(difference), rightPath.substr(difference));
}

} // namespace fl::filesystem::detail
