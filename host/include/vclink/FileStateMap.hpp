// SPDX-License-Identifier: MIT
#pragma once

#include <map>

#include "fl/filesystem/path.hpp"
#include "vclink/FileState.hpp"

namespace vclink
{

/// States by path, in the order of file reports.
using FileStateMap = std::map<upath, FileState>;

} // namespace vclink
