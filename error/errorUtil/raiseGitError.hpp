// SPDX-License-Identifier: MIT
#pragma once

#include <string>

namespace vclink::git
{

/// Throws a failure that the library itself finds, as if libgit2 had reported it.
/// @param code of git_error_code, @param errorClass of git_error_t
/// @throws LibGit2Exception
[[noreturn]] void raiseGitError(int code, int errorClass, const std::string &text);

} // namespace vclink::git
