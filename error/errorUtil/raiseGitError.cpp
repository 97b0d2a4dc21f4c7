// SPDX-License-Identifier: MIT
#include "error/errorUtil/raiseGitError.hpp"

#include "error/errorUtil/libgit2Errors.hpp"
#include "vclink/git/LibGit2Exception.hpp"

namespace vclink::git
{

void raiseGitError(int code, int errorClass, const std::string &text)
{
    git_error_set_str(errorClass, text.c_str());
    throw LibGit2Exception(GitError(code));
}

} // namespace vclink::git
