// SPDX-License-Identifier: MIT
#pragma once

#include <map>
#include <string>
#include <vector>

#include "support/GitRepository.hpp"

namespace vclink::test
{

/// What a person would miss in a working copy: the contents of the files that differ from the index
/// or are not in it, the entries of the index, and where the branches stand. By names that tell
/// these apart.
using UserWork = std::map<std::string, std::string>;

/// The names of the files that differ from the index or are not in it.
std::vector<std::string> uncommittedFiles(const GitRepository &repository);
/// @param files whose contents count, whether or not they differ now
UserWork userWork(const GitRepository &repository, const std::vector<std::string> &files);

/// What is neither as it was before an operation nor as the operation leaves it when nothing fails.
std::vector<std::string> lostWork(const UserWork &before, const UserWork &normal,
                                  const UserWork &after);

} // namespace vclink::test
