// SPDX-License-Identifier: MIT
#pragma once

#include "vclink/git/export.hpp"

namespace vclink::git
{

/// What a merge may be told: nothing so far. A plain value.
class VCLINK_GIT_EXPORT MergeOptions
{
  public:
    MergeOptions();
};

} // namespace vclink::git
