// SPDX-License-Identifier: MIT
#pragma once

#include "vclink/FileState.hpp"

namespace vclink::git
{

/// The one state that a file's git_status_t bits come down to. The order of the tests decides: a
/// conflict beats everything, new in the index beats edited since, changed in the index beats gone
/// from the working tree, removed from the index beats still on disk.
FileState::State mapStatusFlags(unsigned int flags) noexcept;

} // namespace vclink::git
