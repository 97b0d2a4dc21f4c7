// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

#include <git2/types.h>

namespace vclink::git
{

/// Returns the folders with the objects of a repository, without slashes at their ends: its own,
/// and those from which it borrows (`objects/info/alternates`), up to git's depth.
/// @throws LibGit2Exception if an existing list of alternates cannot be read
std::vector<std::string> findObjectFolders(git_repository *repository);

} // namespace vclink::git
