// SPDX-License-Identifier: MIT
#pragma once

#include "vclink/git/ProxyOptions.hpp"
#include "vclink/git/export.hpp"

namespace vclink::git
{

/// Options for a fetch. A plain value.
class VCLINK_GIT_EXPORT FetchOptions
{
  public:
    FetchOptions();

    /// Options for the connection.
    ProxyOptions proxyOptions;
};

} // namespace vclink::git
