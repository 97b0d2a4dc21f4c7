// SPDX-License-Identifier: MIT
#include "error/errorUtil/raiseSystemError.hpp"

#include <system_error>

#include "error/errorUtil/setGitError.hpp"
#include "vclink/git/LibGit2Exception.hpp"

namespace vclink::git
{

void raiseSystemError(int error, const std::string &text)
{
    const std::string reason = std::generic_category().message(error);
    git_error_set_str(GIT_ERROR_OS, (text + ": " + reason).c_str());
    throw LibGit2Exception(GitError(GIT_ERROR));
}

} // namespace vclink::git
