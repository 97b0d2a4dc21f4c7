// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>

#include "vclink/git/ProxyOptions.hpp"
#include "vclink/git/export.hpp"

namespace vclink::git
{

/// Options for a push. A plain value.
class VCLINK_GIT_EXPORT PushOptions
{
  public:
    PushOptions();

    /// The number of threads that pack objects. 1 by default.
    std::uint32_t packbuilderParallelism;
    /// Options for the connection.
    ProxyOptions proxyOptions;
};

} // namespace vclink::git
