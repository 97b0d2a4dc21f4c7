// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

namespace vclink::git
{

/// Returns the lines of a file in which git keeps a state; none if there is no such file.
/// @throws LibGit2Exception if it cannot be read
std::vector<std::string> linesOf(const std::string &path);

} // namespace vclink::git
