// SPDX-License-Identifier: MIT
#pragma once

#include "vclink/git/export.hpp"

namespace vclink::git
{

/// Options for proxies: none so far, and no proxy is used. A plain value.
class VCLINK_GIT_EXPORT ProxyOptions
{
  public:
    ProxyOptions();
};

} // namespace vclink::git
