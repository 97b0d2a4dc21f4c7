// SPDX-License-Identifier: MIT
#pragma once

#include "vclink/git/export.hpp"

namespace vclink::git
{

/// Options for a merge: none so far. A plain value.
class VCLINK_GIT_EXPORT MergeOptions
{
  public:
    MergeOptions();
};

} // namespace vclink::git
