// SPDX-License-Identifier: MIT
#include "util/path/pathspecEscape.hpp"

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

/// Returns a class of one character, because a backslash before the character fails in two cases.
/// libgit2 searches below the common beginning of all patterns, up to the first wildcard: for "\#a"
/// and "\!b" that is a single backslash, and nothing is found. And libgit2 removes a trailing
/// carriage return even after a backslash. In the class, '!' negates and a line end ends the
/// pattern, unless a backslash is before it.
std::string classOf(char character)
{
    const bool special = character == '!' || character == '\\' || contains(lineEnds, character);
    return std::string(special ? "[\\" : "[") + character + ']';
}

/// Returns the character as the complement of all others. libgit2 also compares a pattern literally
/// with names: because of the two slashes, no file has such a name.
std::string complementOf(char character)
{
    const auto escaped = [](int code)
    {
        const char end = static_cast<char>(code);
        const bool special = contains("\\]!^-", end) || contains(whiteSpace, end);
        return special ? std::string("\\") + end : std::string(1, end);
    };
    const int code = static_cast<unsigned char>(character);
    return "[^//\x01-" + escaped(code - 1) + escaped(code + 1) + "-\xFF]";
}

/// libgit2 reads nearly all names literally.
bool isReadAsItStands(std::string_view name)
{
    return !name.empty() && name.front() != '#' && name.front() != '!' &&
           !contains(whiteSpace, name.back()) &&
           name.find_first_of(lineEnds) == std::string_view::npos;
}

/// Returns the start of the white space that libgit2 would remove.
std::size_t findTrailingWhiteSpace(std::string_view name)
{
    const std::size_t last = name.find_last_not_of(whiteSpace);
    return last == std::string_view::npos ? 0 : last + 1;
}

/// @param special the characters that get a class in any place
/// @param makeClass makes a pattern that means one character
std::string escape(std::string_view name, std::string_view special,
                   std::string (*makeClass)(char character))
{
    const std::size_t end = findTrailingWhiteSpace(name);
    std::string pattern;
    pattern.reserve(name.size());
    for (std::size_t i = 0; i < name.size(); ++i)
    {
        const char character = name[i];
        const bool leading = i == 0 && (character == '#' || character == '!');
        if (leading || i >= end || contains(special, character) || contains(lineEnds, character))
        {
            pattern += makeClass(character);
        }
        else
        {
            pattern += character;
        }
    }
    return pattern;
}

} // namespace

std::string escapePathspec(std::string_view name)
{
    // An unchanged '[' could include a following class.
    return isReadAsItStands(name) ? std::string(name) : escape(name, "[", classOf);
}

std::string escapeExactPathspec(std::string_view name)
{
    return escape(name, "*?[\\", complementOf);
}

} // namespace vclink::git
