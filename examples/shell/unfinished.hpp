// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "vclink/CMAdapter.hpp"

namespace vclink::shell
{

/// @throws ShellFailure during an operation with more than one commit, e.g. a rebase: a commit of
/// the back end ends it, and drops the rest without a warning; also while a commit of another
/// author is being picked: the back end does not keep the author
void refuseHalfWay(CMAdapter &adapter);

/// Whether a merge is under way, with conflicts or without.
bool isMergeUnderWay(CMAdapter &adapter);

/// Whether a merge is under way that was killed before all of it was written.
bool isMergeInterrupted(CMAdapter &adapter);

/// How to go on with a merge that is under way, or that was interrupted; empty if there is none.
std::string describeUnfinishedMerge(CMAdapter &adapter);

/// How to go on with whatever is under way; empty if nothing is.
std::string describeUnfinished(CMAdapter &adapter);

} // namespace vclink::shell
