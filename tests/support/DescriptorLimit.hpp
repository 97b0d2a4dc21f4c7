// SPDX-License-Identifier: MIT
#pragma once

#include <gtest/gtest.h>
#include <sys/resource.h>

namespace vclink::test
{

/// Lets the process open no descriptor of this number or a higher one, until its end. Those that
/// are open stay.
class DescriptorLimit
{
  public:
    explicit DescriptorLimit(int limit)
    {
        EXPECT_EQ(::getrlimit(RLIMIT_NOFILE, &before_), 0);
        rlimit few = before_;
        few.rlim_cur = static_cast<rlim_t>(limit);
        EXPECT_EQ(::setrlimit(RLIMIT_NOFILE, &few), 0);
    }
    DescriptorLimit(const DescriptorLimit &) = delete;
    DescriptorLimit &operator=(const DescriptorLimit &) = delete;
    ~DescriptorLimit()
    {
        EXPECT_EQ(::setrlimit(RLIMIT_NOFILE, &before_), 0);
    }

  private:
    rlimit before_{};
};

} // namespace vclink::test
