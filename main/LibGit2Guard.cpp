// SPDX-License-Identifier: MIT
#include "vclink/git/LibGit2Guard.hpp"

#include <git2/global.h>

namespace vclink::git
{

LibGit2Guard::LibGit2Guard()
{
    git_libgit2_init();
}

LibGit2Guard::~LibGit2Guard()
{
    git_libgit2_shutdown();
}

} // namespace vclink::git
