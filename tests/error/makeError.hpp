// SPDX-License-Identifier: MIT
#pragma once

#include "error/errorUtil/libgit2Errors.hpp"
#include "vclink/git/GitError.hpp"

namespace vclink::test
{

/// The error that libgit2 reports to this thread with the code, the class and the text.
inline git::GitError makeError(int code, int errorClass, const char *text)
{
    git_error_set_str(errorClass, text);
    return git::GitError(code);
}

} // namespace vclink::test
