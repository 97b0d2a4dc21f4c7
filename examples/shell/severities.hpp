// SPDX-License-Identifier: MIT
#pragma once

#include <optional>
#include <string>

namespace vclink::shell
{

/// The name of the library's logger.
inline constexpr const char *libraryLogger = "vclink::git";

/// The severity of what an operation or a callback is told.
inline constexpr unsigned parameterSeverity = 0x02;

/// The severity of decisions and failures.
inline constexpr unsigned diagnosticSeverity = 0x08;

/// The mask that a list of severities means: names separated by commas, or a number, decimal or
/// with "0x" hexadecimal. Nothing if it can't be understood.
std::optional<unsigned> parseSeverities(const std::string &text);

/// The names that parseSeverities() knows, separated by commas and blanks.
std::string severityNames();

/// The name of one severity; its number where it has no name.
std::string severityName(unsigned severity);

} // namespace vclink::shell
