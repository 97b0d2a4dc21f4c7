// SPDX-License-Identifier: MIT
#pragma once

#include <optional>
#include <set>
#include <string>

namespace vclink::git
{

/// Returns the path if libgit2 takes the address of a remote for a folder of this machine: a path,
/// or a URL that begins with "file://".
std::optional<std::string> findRemotePath(const std::string &address);

/// Returns the full names of the branches that the linked working trees of a repository have
/// checked out, or to which they return after a rebase or bisection, also if their folders are
/// missing.
/// @param path of a repository, or of a folder with `.git`
/// @throws LibGit2Exception if this cannot be found out
std::set<std::string> findCheckedOut(const std::string &path);

/// Returns the full name of the repository's own current branch; empty if HEAD is detached.
/// @param path as above
std::string findCurrent(const std::string &path);

} // namespace vclink::git
