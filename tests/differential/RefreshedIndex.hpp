// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "support/GitRepository.hpp"

namespace vclink::test
{

/// What the refresh of a commit makes of the index in memory, a line an entry with all that the
/// index holds of it, and a line a resolved conflict; or its code, class and text. Neither writes
/// the index. libgit2 must run.

/// By git_index_update_all alone. Then what a sparse checkout leaves out is put back, and a file
/// that can't be seen counts as a failure.
std::string refreshByLibGit2(const GitRepository &repository);

/// As the library's commits do it.
std::string refreshByLibrary(const GitRepository &repository);

} // namespace vclink::test
