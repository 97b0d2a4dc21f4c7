// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>
#include <map>
#include <string>

namespace vclink::git
{

/// Returns a command template with every placeholder replaced by its value, one placeholder after
/// the other in the map's order. Quotes nothing. If a value contains a later placeholder, that is
/// replaced too.
std::string expandPlaceholders(const std::string &commandTemplate,
                               const std::map<std::string, std::string> &placeholders);

/// Returns why a command must not be passed to Boost.Process, which would crash or read beyond its
/// words: no word at all, a single double quote as the last word, an empty environment.
/// @return the fault in words, null if there is none
[[nodiscard]] const char *findCommandFault(const std::string &command) noexcept;

/// One word of a command: its place, and its text after Boost.Process has split the command.
struct CommandWord
{
    std::size_t begin;
    std::size_t size;
    std::string text;
};

/// Returns the word that names the program. Splits the command as Boost.Process does: at blanks
/// outside double quotes, with one pair of quotes around a word removed.
/// @param command without the faults of findCommandFault()
CommandWord findFirstWord(const std::string &command);

} // namespace vclink::git
