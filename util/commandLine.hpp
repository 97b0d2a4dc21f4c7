// SPDX-License-Identifier: MIT
#pragma once

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
const char *findCommandFault(const std::string &command) noexcept;

} // namespace vclink::git
