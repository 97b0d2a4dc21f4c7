// SPDX-License-Identifier: MIT
#pragma once

#include "vclink/git/export.hpp"

namespace vclink::git
{

/// Options for a walk over the states of files: none so far. A plain value.
class VCLINK_GIT_EXPORT StatusOptions
{
  public:
    StatusOptions();
};

} // namespace vclink::git
