// SPDX-License-Identifier: MIT
#pragma once

#include "vclink/FileState.hpp"

namespace vclink::git
{

/// Returns the one state for a file's git_status_t bits. The order of the tests decides: a conflict
/// has priority over everything, new in the index over edited since, changed in the index over
/// missing from the working tree, removed from the index over still on disk.
FileState::State mapStatusFlags(unsigned int flags) noexcept;

} // namespace vclink::git
