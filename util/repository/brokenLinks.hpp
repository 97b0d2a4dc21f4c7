// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

#include <git2/types.h>

namespace vclink::git
{

/// A link below `refs/` whose target cannot be looked at ends libgit2's iterators over references
/// without an error: the loose references after it are missing. So does a link to a folder that
/// contains it, after many turns. Two of these in one circle multiply the turns, so that an
/// iterator may never end.
///
/// Returns true if there is a link of either kind. Call it before an iterator is used.
/// @throws LibGit2Exception that names a link, if two circles share a folder
bool hasBrokenReferenceLink(git_repository *repository);

/// Returns the files in a folder of references, as full names in their order, which are not all
/// references. Leaves out what is behind links to folders.
/// @param folder such as "refs/heads"
std::vector<std::string> findReferenceFiles(git_repository *repository, const std::string &folder);

} // namespace vclink::git
