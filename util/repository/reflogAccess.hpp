// SPDX-License-Identifier: MIT
#pragma once

#include <git2/types.h>

namespace vclink::git
{

/// Refuses a reflog that can neither be appended to nor made: root has made it, or something else
/// is in its place or in the place of a folder above. libgit2 appends to it when it moves the
/// reference, which is after the files were written.
/// @param reference the full name
/// @throws LibGit2Exception
void refuseUnwritableReflog(git_repository *repository, const char *reference);

/// Refuses a reflog that exists and cannot be removed. git_branch_delete removes it after the
/// branch's configuration.
/// @param reference the full name of a branch
/// @throws LibGit2Exception
void refuseUnremovableReflog(git_repository *repository, const char *reference);

} // namespace vclink::git
