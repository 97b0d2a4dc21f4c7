// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "fl/ustring.hpp"

/// Converts texts for libgit2, which uses C strings. A NUL character would silently cut a text, so
/// that it names another file, branch or repository: such a text is refused. An operation converts
/// its texts before it opens anything. Needs a LibGit2Guard.
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
