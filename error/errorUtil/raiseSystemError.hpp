// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include <git2/errors.h>

namespace vclink::git
{

/// Throws what libgit2 itself would give for a system call that failed: code GIT_ERROR, class
/// GIT_ERROR_OS or another of git_error_t, and the text with the system's reason behind it.
/// @param error the call's errno
/// @throws LibGit2Exception
[[noreturn]] void raiseSystemError(int error, const std::string &text,
                                   int errorClass = GIT_ERROR_OS);

} // namespace vclink::git
