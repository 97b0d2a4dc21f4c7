// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "fl/ustring.hpp"

/// Texts on their way to libgit2, which takes C strings. A text with a NUL character would be cut
/// there without notice and name another file, branch or repository, so that it is refused. An
/// operation refuses its texts before it opens anything. Needs a LibGit2Guard.
namespace vclink::git
{

/// @throws LibGit2Exception with GIT_EINVALIDSPEC if the text has a NUL character
void refuseNul(const std::string &text);

/// Returns the text as a C string, which is valid as long as the text.
/// @throws LibGit2Exception with GIT_EINVALIDSPEC if the text has a NUL character
const char *asGitString(const std::string &text);

/// Returns the text in UTF-8.
/// @throws LibGit2Exception with GIT_EINVALIDSPEC if the text has a NUL character
std::string toGitString(const ustring &text);

} // namespace vclink::git
