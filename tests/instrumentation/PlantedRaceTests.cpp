// SPDX-License-Identifier: MIT
#include <cstdlib>
#include <thread>

#include <gtest/gtest.h>

#include "instrumentation/planted/planted.hpp"

namespace
{

constexpr int exitCodeOfThreadSanitizer = 66;

void race()
{
    int counter = 0;
    std::thread other([&counter] { vclink::planted::countUp(counter); });
    vclink::planted::countUp(counter);
    other.join();
    std::exit(EXIT_SUCCESS);
}

TEST(PlantedFault, RaceIsReportedWithItsFileAndLine)
{
    GTEST_FLAG_SET(death_test_style, "threadsafe");
    EXPECT_EXIT(race(), testing::ExitedWithCode(exitCodeOfThreadSanitizer),
                "data race.*countUp.*planted\\.hpp:[0-9]+");
}

} // namespace
