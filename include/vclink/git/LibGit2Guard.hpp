// SPDX-License-Identifier: MIT
#pragma once

#include "vclink/git/export.hpp"

namespace vclink::git
{

/// Keeps libgit2 alive: git_libgit2_init at construction, git_libgit2_shutdown at destruction.
/// Guards nest by libgit2's own count; libgit2 lives from the first guard's construction to the
/// last one's destruction. A failure of either call goes unnoticed here, and shows in the next
/// libgit2 call.
///
/// Starting libgit2 costs 10 to 15 milliseconds, most of it for the system's certificates. A host
/// that probes many folders with GitAdapterFactory::isAdapterFor holds a guard of its own
/// meanwhile.
///
/// Guards may be made and destroyed on any thread.
class VCLINK_GIT_EXPORT LibGit2Guard
{
  public:
    LibGit2Guard();
    LibGit2Guard(const LibGit2Guard &) = delete;
    LibGit2Guard &operator=(const LibGit2Guard &) = delete;
    ~LibGit2Guard();
};

} // namespace vclink::git
