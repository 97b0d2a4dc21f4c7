// SPDX-License-Identifier: MIT
#pragma once

#include <optional>
#include <string>
#include <vector>

#include <CLI/CLI.hpp>

/// Hides arguments that CLI11 would misread, until they have found their option.
namespace vclink::shell
{

/// The arguments in reverse order, as CLI11 reads them.
std::vector<std::string> readArguments(int argc, const char *const *argv);

/// The argument as it was given.
std::string showHidden(std::string text);

/// Has a command's options take the arguments as they were given.
void showHiddenValues(CLI::App &line);

/// The locale that the option --lang names, if it is there. It is needed before the line is read,
/// because messages about the line are in that language.
std::optional<std::string> findLocale(int argc, const char *const *argv);

} // namespace vclink::shell
