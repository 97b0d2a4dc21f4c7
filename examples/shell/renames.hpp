// SPDX-License-Identifier: MIT
#pragma once

#include <vector>

#include "vclink/CMAdapter.hpp"
#include "vclink/FileStateMap.hpp"

/// The back end reports a file that was renamed in the index under its old name only, and a new
/// file of that name as untracked. Here the old name is deleted and the new one added. If git is
/// not installed, the back end is asked for the new names, except if very many files have no state.
namespace vclink::shell
{

/// The states of all files below a folder.
FileStateMap folderStates(CMAdapter &adapter, const upath &folder);

/// The states of files, and of those below folders, which are free of symbolic links.
FileStateMap fileStates(CMAdapter &adapter, const std::vector<upath> &files);

} // namespace vclink::shell
