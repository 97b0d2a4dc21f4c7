// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

#include "TerminalProcess.hpp"

namespace vclink::test
{

/// Runs a program to its end with a terminal of its own as its standard input, output and error.
/// @param arguments the program, found in PATH unless it has a slash, and its arguments
/// @throws std::system_error when there is no terminal to be had, std::runtime_error when the
///         program has not ended within a minute; it is killed then
TerminalResult runOnTerminal(const std::vector<std::string> &arguments);

} // namespace vclink::test
