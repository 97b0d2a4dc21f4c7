// SPDX-License-Identifier: MIT
#include "error/notAvailable.hpp"

#include <git2/errors.h>

#include "vclink/git/LibGit2Exception.hpp"

namespace vclink::git
{

void raiseNotAvailable()
{
    git_error_set_str(GIT_ERROR_INVALID, "not available in this build");
    throw LibGit2Exception(GitError(GIT_ERROR));
}

} // namespace vclink::git
