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

/// The files whose attribute names this merge driver.
FileStateMap withDriver(CMAdapter &adapter, const FileStateMap &files, const std::string &driver);

/// The files that both HEAD and the other side have changed, differently; none without git.
FileStateMap findChangedByBoth(CMAdapter &adapter, const std::optional<std::string> &theirs);

/// The files that the merge wrote under another name, because something else has theirs; also
/// ignored ones.
/// @param states of the whole working copy
FileStateMap findSetAside(const upath &root, const FileStateMap &states);

/// Names these files to the person, if a merge is under way: its commit lacks them.
void tellSetAside(CMAdapter &adapter);

} // namespace vclink::shell
