// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <string>
#include <vector>

namespace vclink::test
{

bool isBelow(const std::string &path, const std::string &folder);

/// Whether libgit2 reads a name as something else than it is, so that the library has to escape it:
/// leading characters with a meaning, white space that is cut, line ends.
bool isEscaped(const std::string &name);

/// Whether a name in a list means a path: the file itself, and all below a folder of that name. A
/// name that has to be escaped is a pattern, which must match the whole path.
bool isMeant(const std::string &path, const std::string &name);
/// Whether one of the names means a path.
bool isMeant(const std::string &path, const std::vector<std::string> &names);

/// What the names in a list mean below a root: a symbolic link, at the end or on the way, means its
/// target. Leaves out the root itself, and everything outside it.
std::vector<std::string> resolveNames(const std::filesystem::path &root,
                                      const std::vector<std::string> &names);

/// Whether a name in a list is no pattern.
bool isNoPattern(const std::string &name);

/// Whether a name in a list means itself: no pattern, and no link on the way or at the end.
bool isPlain(const std::filesystem::path &root, const std::string &name);

} // namespace vclink::test
