// SPDX-License-Identifier: MIT
#pragma once

#include <git2/oid.h>

namespace vclink::git
{

/// The two commits of a merge: that of HEAD when it began, and the one merged into it.
struct MergeSides
{
    git_oid ours;
    git_oid theirs;
};

} // namespace vclink::git
