// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "vclink/CMAdapter.hpp"
#include "vclink/FileStateMap.hpp"

namespace vclink::shell
{

/// How to restore what a revert discards, in lines for a person; empty for what is not discarded.
struct WayBack
{
    std::string files;
    std::string staged;
};

/// Puts what a revert of these files discards into the repository's store of objects: the files as
/// they are on the disk, and as they are staged if that is something else. The index stays as it
/// is.
/// @throws ShellFailure if something could not be kept, or git is not installed
WayBack keepContents(CMAdapter &adapter, const FileStateMap &files);

} // namespace vclink::shell
