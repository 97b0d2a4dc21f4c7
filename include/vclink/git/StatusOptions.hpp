// SPDX-License-Identifier: MIT
#pragma once

#include "vclink/git/export.hpp"

namespace vclink::git
{

/// What a walk over the states of files may be told: nothing so far. A plain value.
class VCLINK_GIT_EXPORT StatusOptions
{
  public:
    StatusOptions();
};

} // namespace vclink::git
