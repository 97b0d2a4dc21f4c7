// SPDX-License-Identifier: MIT
#pragma once

#include <vector>

#include <fcntl.h>
#include <gtest/gtest.h>

#include "support/Descriptor.hpp"
#include "support/DescriptorLimit.hpp"

namespace vclink::test
{

/// Holds a thousand descriptors open, until its end, and lets the process open so many. Descriptors
/// that are opened during that time have higher numbers.
class ThousandDescriptors
{
  public:
    ThousandDescriptors()
    {
        constexpr int count = 1000;
        for (int i = 0; i < count; ++i)
            open_.emplace_back(::open("/dev/null", O_RDONLY | O_CLOEXEC));
        EXPECT_GE(open_.back().get(), count);
    }

  private:
    const DescriptorLimit limit_{4096};
    std::vector<Descriptor> open_;
};

} // namespace vclink::test
