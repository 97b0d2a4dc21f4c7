// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include <git2/errors.h>

namespace vclink::git
{

/// Throws a failed system call as if libgit2 had reported it: code GIT_ERROR, class GIT_ERROR_OS or
/// another of git_error_t, and the text with the system's reason appended.
/// @param error the call's errno
/// @throws LibGit2Exception
[[noreturn]] void raiseSystemError(int error, const std::string &text,
                                   int errorClass = GIT_ERROR_OS);

} // namespace vclink::git
