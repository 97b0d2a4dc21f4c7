// SPDX-License-Identifier: MIT
#include <atomic>
#include <cstdlib>
#include <thread>

#include <gtest/gtest.h>

#include "foundation/core/log/basic_diagnostic_logger.hpp"
#include "support/AllocationCounter.hpp"
#include "vclink_host/logging.hpp"

namespace
{

using Logger = foundation::core::log::basic_diagnostic_logger<char>;
using vclink_host::getEnabledSeverities;
using vclink_host::setEnabledSeverities;

/// As a back end holds its logger: made at first use, destroyed at the end of the process.
Logger &staticLogger()
{
    static Logger logger("tests.static");
    return logger;
}

TEST(StandInLogging, ReachesEveryLoggerOfTheName)
{
    Logger one("tests.byName");
    const Logger two("tests.byName");
    const Logger other("tests.otherName");
    setEnabledSeverities("tests.byName", 0x12);
    EXPECT_EQ(one.enabled_severities(), 0x12U);
    EXPECT_EQ(two.enabled_severities(), 0x12U);
    EXPECT_EQ(other.enabled_severities(), 0U);
    EXPECT_EQ(getEnabledSeverities("tests.byName"), 0x12U);
    setEnabledSeverities("tests.byName", 0);
    EXPECT_FALSE(one.is_enabled(~0U));
}

TEST(StandInLogging, IsRememberedForALoggerThatComesLater)
{
    setEnabledSeverities("tests.later", 0x40);
    for (int round = 0; round < 2; ++round)
    {
        EXPECT_EQ(getEnabledSeverities("tests.later"), 0x40U);
        const Logger logger("tests.later");
        EXPECT_TRUE(logger.is_enabled(0x40));
        EXPECT_EQ(logger.enabled_severities(), 0x40U);
    }
}

TEST(StandInLogging, TellsWhatTheLoggerItselfHasEnabledAndNothingForANameThatNobodyUsed)
{
    Logger logger("tests.itself");
    logger.set_enabled_severities(0x04);
    EXPECT_EQ(getEnabledSeverities("tests.itself"), 0x04U);
    EXPECT_EQ(getEnabledSeverities("tests.unknown"), 0U);
}

TEST(StandInLogging, CostsADisabledSeverityNoMemoryAndNoObject)
{
    const Logger logger("tests.memory");
    const vclink::test::AllocationCounter counter;
    EXPECT_FALSE(logger.is_enabled(0x02));
    EXPECT_EQ(counter.count(), 0U);
    foundation::core::log::diagnostic_record<char> none;
    EXPECT_FALSE(static_cast<bool>(none));
    const auto moved = std::move(none);
    EXPECT_FALSE(static_cast<bool>(moved));
}

TEST(StandInLogging, IsChangedWhileAnotherThreadReadsIt)
{
    const Logger logger("tests.race");
    std::atomic<bool> isDone(false);
    std::thread reader(
        [&logger, &isDone]
        {
            while (!isDone)
            {
                const unsigned seen = logger.enabled_severities();
                EXPECT_TRUE(seen == 0 || seen == 0x08);
            }
        });
    for (int round = 0; round < 1000; ++round)
        setEnabledSeverities("tests.race", round % 2 == 0 ? 0x08 : 0);
    isDone = true;
    reader.join();
    EXPECT_EQ(getEnabledSeverities("tests.race"), 0U);
}

TEST(StandInLoggingDeathTest, LastsLongerThanALoggerWithStaticStorage)
{
    testing::FLAGS_gtest_death_test_style = "threadsafe";
    EXPECT_EXIT(
        {
            staticLogger().set_enabled_severities(0x08);
            std::exit(getEnabledSeverities("tests.static") == 0x08 ? 0 : 1);
        },
        testing::ExitedWithCode(0), "");
}

} // namespace
