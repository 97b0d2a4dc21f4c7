// SPDX-License-Identifier: MIT
#pragma once

#include <initializer_list>
#include <set>
#include <string>

#include <git2/types.h>

#include "main/checkout/Obstacle.hpp"

namespace vclink::git
{

/// Returns true if the sibling sorts between a file of this name and what is in a folder of the
/// same name: "lib-1" and "lib.txt" do so for "lib". libgit2 sees the conflict of a file with a
/// folder only if the two are next to each other.
bool sortsBetweenFileAndFolder(const std::string &name, const std::string &sibling) noexcept;

/// Finds the first of these paths beside which a tree has such a sibling.
/// @throws LibGit2Exception if a tree cannot be read
Finding findSibling(git_repository *repository, std::initializer_list<const git_tree *> trees,
                    const std::set<std::string> &paths);

} // namespace vclink::git
