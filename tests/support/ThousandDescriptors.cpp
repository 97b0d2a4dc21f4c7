// SPDX-License-Identifier: MIT
#include "support/ThousandDescriptors.hpp"

#include <algorithm>

#include <fcntl.h>
#include <gtest/gtest.h>
#include <unistd.h>

namespace vclink::test
{

ThousandDescriptors::ThousandDescriptors()
{
    constexpr int count = 1000;
    EXPECT_EQ(::getrlimit(RLIMIT_NOFILE, &limitBefore_), 0);
    rlimit more = limitBefore_;
    more.rlim_cur = std::min<rlim_t>(limitBefore_.rlim_max, 4096);
    EXPECT_EQ(::setrlimit(RLIMIT_NOFILE, &more), 0);
    for (int i = 0; i < count; ++i)
        open_.push_back(::open("/dev/null", O_RDONLY | O_CLOEXEC));
    EXPECT_GE(*std::max_element(open_.begin(), open_.end()), count);
}

ThousandDescriptors::~ThousandDescriptors()
{
    for (const int descriptor : open_)
        ::close(descriptor);
    EXPECT_EQ(::setrlimit(RLIMIT_NOFILE, &limitBefore_), 0);
}

} // namespace vclink::test
