// SPDX-License-Identifier: MIT
#pragma once

#include <optional>
#include <string>

#include "vclink/CMAdapter.hpp"
#include "vclink/FileStateMap.hpp"

namespace vclink::shell
{

/// What may be lost in a merge that was refused. The back end names one file, or none.
struct MergeObstacles
{
    /// tracked files with changes that are not committed, including missing ones, but not those
    /// that a sparse checkout leaves out
    FileStateMap changed;
    /// untracked files where the other side has something
    FileStateMap untracked;
    /// submodules whose folders are gone
    FileStateMap missingSubmodules;
};

/// @param theirs the commit that was to be merged
/// @throws ShellFailure if the states of the files can't be known
MergeObstacles findMergeObstacles(CMAdapter &adapter, const std::optional<std::string> &theirs);

} // namespace vclink::shell
