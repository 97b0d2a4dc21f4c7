// SPDX-License-Identifier: MIT
#pragma once

#include <gmock/gmock.h>

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

/// Matches an error with this code, class and text.
inline auto isError(int code, int errorClass, const ustring &text)
{
    return testing::AllOf(testing::Property(&git::GitError::getCode, code),
                          testing::Property(&git::GitError::getErrorClass, errorClass),
                          testing::Property(&git::GitError::getMessage, text));
}

} // namespace vclink::test
