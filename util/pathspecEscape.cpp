// SPDX-License-Identifier: MIT
#include "util/pathspecEscape.hpp"

namespace vclink::git
{
namespace
{

constexpr std::string_view lineEnds = "\n\v\f";
constexpr std::string_view whiteSpace = " \t\r\n\v\f";

bool contains(std::string_view characters, char character)
{
    return characters.find(character) != std::string_view::npos;
}

/// A class of one character, not the character behind a backslash: libgit2 takes the common
/// beginning of all patterns, up to the first wildcard, for where to look, so that of "\#a" and
/// "\!b" a lone backslash would remain, and nothing be found; and a trailing carriage return is
/// cut even behind a backslash. Within the class '!' negates and a line's end ends the pattern,
/// unless a backslash stands before it.
std::string classOf(char character)
{
    const bool special = character == '!' || contains(lineEnds, character);
    return std::string(special ? "[\\" : "[") + character + ']';
}

/// Nearly all names are read as they stand.
bool isReadAsItStands(std::string_view name)
{
    return !name.empty() && name.front() != '#' && name.front() != '!' &&
           !contains(whiteSpace, name.back()) &&
           name.find_first_of(lineEnds) == std::string_view::npos;
}

} // namespace

std::string escapePathspec(std::string_view name)
{
    if (isReadAsItStands(name))
    {
        return std::string(name);
    }
    const std::size_t lastPlain = name.find_last_not_of(whiteSpace);
    const std::size_t end = lastPlain == std::string_view::npos ? 0 : lastPlain + 1;
    std::string pattern;
    pattern.reserve(name.size());
    for (std::size_t i = 0; i < name.size(); ++i)
    {
        const char character = name[i];
        const bool leading = i == 0 && (character == '#' || character == '!');
        // A '[' left as it is could take a class that follows into its own.
        if (leading || i >= end || character == '[' || contains(lineEnds, character))
        {
            pattern += classOf(character);
        }
        else
        {
            pattern += character;
        }
    }
    return pattern;
}

} // namespace vclink::git
