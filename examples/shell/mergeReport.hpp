// SPDX-License-Identifier: MIT
#pragma once

#include <optional>
#include <string>

#include "MergeLog.hpp"
#include "vclink/CMAdapter.hpp"

/// What a person is told after a merge that was not done, beside the back end's own words.
namespace vclink::shell
{

/// After a merge with conflicts: which files, and what is to be done.
void tellConflicts(CMAdapter &adapter, const MergeNotes &notes);

/// After a merge that changed nothing: what was in its way.
/// @param theirs the commit that was to be merged
void tellRefusal(CMAdapter &adapter, const MergeNotes &notes,
                 const std::optional<std::string> &theirs);

/// After a merge that could not begin: how to finish what was under way before.
void tellUnfinished(CMAdapter &adapter);

} // namespace vclink::shell
