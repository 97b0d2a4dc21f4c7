// SPDX-License-Identifier: MIT
#pragma once

#include "vclink/git/export.hpp"

namespace vclink::git
{

/// What a connection may be told about proxies: nothing so far; none is used. A plain value.
class VCLINK_GIT_EXPORT ProxyOptions
{
  public:
    ProxyOptions();
};

} // namespace vclink::git
