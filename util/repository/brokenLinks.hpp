// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

#include <git2/types.h>

namespace vclink::git
{

/// A link below `refs/` whose target cannot be looked at ends libgit2's iterators over references
/// without an error: the loose references after it are missing.
///
/// Returns the files in a folder of references then, as full names in their order, which are not
/// all references; nothing if there is no such link. Leaves out what is behind links to folders.
/// @param folder such as "refs/heads"
std::vector<std::string> findFilesBesideBrokenLink(git_repository *repository,
                                                   const std::string &folder);

} // namespace vclink::git
