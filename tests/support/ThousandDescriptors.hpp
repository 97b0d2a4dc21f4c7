// SPDX-License-Identifier: MIT
#pragma once

#include <vector>

#include <sys/resource.h>

namespace vclink::test
{

/// Holds a thousand descriptors open, until its end, and lets the process open so many. Descriptors
/// that are opened during that time have higher numbers.
class ThousandDescriptors
{
  public:
    ThousandDescriptors();
    ThousandDescriptors(const ThousandDescriptors &) = delete;
    ThousandDescriptors &operator=(const ThousandDescriptors &) = delete;
    ~ThousandDescriptors();

  private:
    rlimit limitBefore_{};
    std::vector<int> open_;
};

} // namespace vclink::test
