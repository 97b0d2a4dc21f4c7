// SPDX-License-Identifier: MIT
#include <limits>

#include <gtest/gtest.h>

#include "instrumentation/planted/planted.hpp"

namespace
{

// Tests themselves are compiled without this sanitizer: only the layers' copy of the function
// reports it.
TEST(PlantedFault, OverflowOfASignedNumberIsReportedWithItsFileAndLine)
{
    GTEST_FLAG_SET(death_test_style, "threadsafe");
    EXPECT_DEATH(vclink::planted::successor(std::numeric_limits<int>::max()),
                 "planted\\.hpp:[0-9]+.*signed integer overflow");
}

} // namespace
