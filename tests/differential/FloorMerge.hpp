// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "support/GitRepository.hpp"

namespace vclink::test
{

/// Merges a commit into HEAD with plain calls to libgit2, and commits the result where nothing is
/// in conflict. libgit2 must run.
/// @return whether nothing is in conflict
/// @throws std::runtime_error with libgit2's words
bool mergeWithLibGit2(const GitRepository &repository, const std::string &id);

} // namespace vclink::test
