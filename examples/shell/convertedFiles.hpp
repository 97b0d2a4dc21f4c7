// SPDX-License-Identifier: MIT
#pragma once

#include "vclink/CMAdapter.hpp"
#include "vclink/FileStateMap.hpp"

namespace vclink::shell
{

/// The files that git converts by a filter's command or from another encoding before it stores
/// them, and that a commit stores as they are: the back end runs no commands. Also those that
/// nobody has changed, after a copy of the working copy. Empty if git is not installed.
/// @param states of all files
FileStateMap findUnconverted(CMAdapter &adapter, const FileStateMap &states);

} // namespace vclink::shell
