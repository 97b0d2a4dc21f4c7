// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <system_error>

namespace vclink::git
{

/// Makes Boost.Process start the program that execvpe(3) would start: a name without a slash is
/// looked up in PATH only, and the first folder that has it counts. Boost.Process alone prefers a
/// file in the working folder, and up to 1.77 ignores the first folder of PATH.
/// @param command without the faults of findCommandFault()
/// @param error set if there is no such program, or none that can be named
/// @return the command, unchanged unless Boost.Process would find another file: then with the
/// program's path instead of its name
/// @throws std::bad_alloc
[[nodiscard]] std::string nameProgram(const std::string &command, std::error_code &error);

} // namespace vclink::git
