// SPDX-License-Identifier: MIT
#include "main/libgit2Features.hpp"

#include <git2/common.h>

namespace vclink::git
{

int libgit2Features()
{
    return git_libgit2_features() &
           (GIT_FEATURE_THREADS | GIT_FEATURE_HTTPS | GIT_FEATURE_SSH | GIT_FEATURE_NSEC);
}

} // namespace vclink::git
