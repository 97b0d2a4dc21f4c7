// SPDX-License-Identifier: MIT
#pragma once

#include "vclink/git/ProxyOptions.hpp"
#include "vclink/git/export.hpp"

namespace vclink::git
{

/// What a fetch is told. A plain value.
class VCLINK_GIT_EXPORT FetchOptions
{
  public:
    FetchOptions();

    /// For the connection.
    ProxyOptions proxyOptions;
};

} // namespace vclink::git
