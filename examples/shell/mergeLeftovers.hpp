// SPDX-License-Identifier: MIT
#pragma once

#include <optional>
#include <string>

#include "MergeLog.hpp"
#include "vclink/CMAdapter.hpp"
#include "vclink/FileStateMap.hpp"

/// What a merge with conflicts leaves in the working copy, beside the files in conflict.
namespace vclink::shell
{

/// The files in conflict that a merge command refused. They may have no conflict markers.
/// @param conflicts the files in conflict
FileStateMap findRefused(CMAdapter &adapter, const FileStateMap &conflicts,
                         const MergeNotes &notes);

/// Those of the files that a merge driver is for.
FileStateMap withDriver(CMAdapter &adapter, const FileStateMap &files, const std::string &driver);

/// The files that HEAD and the other side have changed, each in its way; none without git.
FileStateMap findChangedByBoth(CMAdapter &adapter, const std::optional<std::string> &theirs);

/// The files that have another name than in the commits, because something else has theirs;
/// ignored ones, too.
/// @param states of the whole working copy
FileStateMap findSetAside(const upath &root, const FileStateMap &states);

/// Names these files to the person, if a merge is under way: its commit lacks them.
void tellSetAside(CMAdapter &adapter);

} // namespace vclink::shell
