// SPDX-License-Identifier: MIT
#pragma once

#include <optional>
#include <string>

namespace vclink::git
{

/// Returns the path if libgit2 takes the address of a remote for a folder of this machine: a path,
/// or a URL that begins with "file://".
std::optional<std::string> findRemotePath(const std::string &address);

} // namespace vclink::git
