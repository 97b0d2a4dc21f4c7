// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>
#include <map>
#include <string>

namespace vclink::git
{

/// A command template with every placeholder replaced by its value, one placeholder after the other
/// in the map's order, as plain text: a value that holds a later placeholder has it replaced too,
/// and nothing is quoted.
std::string expandPlaceholders(const std::string &commandTemplate,
                               const std::map<std::string, std::string> &placeholders);

/// What makes a command impossible to hand to Boost.Process, which would crash or read beyond its
/// words: no word at all, a lone double quote as the last word, an empty environment.
/// @return the fault in words; null when there is none
[[nodiscard]] const char *findCommandFault(const std::string &command) noexcept;

/// One word of a command: its place, and what Boost.Process makes of it.
struct CommandWord
{
    std::size_t begin;
    std::size_t size;
    std::string text;
};

/// The word that names the program, as Boost.Process splits a command: at blanks outside double
/// quotes, with one pair of quotes around the word taken off.
/// @param command one without the faults of findCommandFault()
CommandWord findFirstWord(const std::string &command);

} // namespace vclink::git
