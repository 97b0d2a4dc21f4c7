// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>
#include <string>
#include <vector>

#include <sys/types.h>

namespace vclink::test
{

/// Arguments or variables as a program is started with them; the texts must outlive them.
std::vector<char *> makePointers(std::vector<std::string> &texts);

/// Whether a child process ends within the time. Its status stays there to be collected.
/// @throws std::system_error when it can't be watched
bool endsWithin(pid_t child, std::chrono::milliseconds time);

/// Waits for the end of a child process.
/// @return the status as waitpid() gives it
/// @throws std::system_error when there is no such child
int collectStatus(pid_t child);

} // namespace vclink::test
