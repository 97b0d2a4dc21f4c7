// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>

#include "vclink/git/ProxyOptions.hpp"
#include "vclink/git/export.hpp"

namespace vclink::git
{

/// What a push is told. A plain value.
class VCLINK_GIT_EXPORT PushOptions
{
  public:
    PushOptions();

    /// How many threads pack objects; 1 at the start.
    std::uint32_t packbuilderParallelism;
    /// For the connection.
    ProxyOptions proxyOptions;
};

} // namespace vclink::git
