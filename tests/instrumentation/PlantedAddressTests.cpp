// SPDX-License-Identifier: MIT
#include <vector>

#include <gtest/gtest.h>

#include "instrumentation/planted/planted.hpp"

namespace
{

TEST(PlantedFault, BeyondTheEndIsReportedWithItsFileAndLine)
{
    GTEST_FLAG_SET(death_test_style, "threadsafe");
    const std::vector<char> bytes(4);
    EXPECT_DEATH(vclink::planted::byteAt(bytes.data(), bytes.size()),
                 "heap-buffer-overflow.*byteAt.*planted\\.hpp:[0-9]+");
}

} // namespace
