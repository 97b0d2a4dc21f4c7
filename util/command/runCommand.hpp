// SPDX-License-Identifier: MIT
#pragma once

#include <map>
#include <string>

namespace vclink::git
{

/// Runs a command to its end, on the calling thread, and logs its output. Splits the command into
/// words at blanks outside double quotes, without a shell. Looks up a program without a slash as
/// execvpe(3) does. The command runs in the process's working directory, with its environment and
/// standard input; standard error is discarded. Reads the output line by line up to the first empty
/// line or the child's end.
/// @param commandTemplate, placeholders see expandPlaceholders()
/// @return the exit status, or the number of the signal that ended the command
/// @throws boost::process::process_error if the command cannot be started or observed, or if its
/// status is unknown; then nothing is left behind
[[nodiscard]] int runCommand(const std::string &commandTemplate,
                             const std::map<std::string, std::string> &placeholders);

} // namespace vclink::git
