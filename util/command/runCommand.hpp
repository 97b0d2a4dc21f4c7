// SPDX-License-Identifier: MIT
#pragma once

#include <map>
#include <string>

namespace vclink::git
{

/// Runs a command to its end, on the calling thread, and writes what it prints to the log. The
/// command is split into words at blanks outside double quotes; no shell takes part. A program
/// without a slash is looked up as execvpe(3) does. The command runs in the process's working
/// directory, with its environment and standard input; standard error is dropped. Its output is
/// read line by line up to the first empty line or the child's end.
/// @param commandTemplate, placeholders see expandPlaceholders()
/// @return the exit status, or the number of the signal that ended the command
/// @throws boost::process::process_error when the command can't be started or watched, or its
/// status can't be known: nothing is left behind then
[[nodiscard]] int runCommand(const std::string &commandTemplate,
                             const std::map<std::string, std::string> &placeholders);

} // namespace vclink::git
