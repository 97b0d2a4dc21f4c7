// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <system_error>

namespace vclink::git
{

/// Makes sure that Boost.Process starts the program that execvpe(3) would: one whose name has no
/// slash comes from PATH only, from the first of its folders that has it. Boost.Process by itself
/// takes a file of the working folder first, and up to 1.77 leaves out PATH's first folder.
/// @param command a command without the faults of findCommandFault()
/// @param error set when there is no such program, or none that can be named
/// @return the command, unchanged unless Boost.Process would take another file: then with the
/// program's path in place of its name
/// @throws std::bad_alloc
[[nodiscard]] std::string nameProgram(const std::string &command, std::error_code &error);

} // namespace vclink::git
