// SPDX-License-Identifier: MIT
#include <string>
#include <thread>

#include <gtest/gtest.h>

#include "foundation/core/log/basic_diagnostic_logger.hpp"
#include "support/LogRecorder.hpp"

namespace
{

using Logger = foundation::core::log::basic_diagnostic_logger<char>;
using vclink_host_tests::LoggingSwitchedOff;
using vclink_host_tests::LogRecorder;

constexpr unsigned parameter = 0x02;
constexpr unsigned diagnostic = 0x08;

/// A write as the logger's users make it: the bit, the core, the record, and only then the text.
/// @return whether the text was built
bool write(Logger &logger, unsigned severity, const std::string &text)
{
    if (!logger.is_enabled(severity) || !logger.is_logging_enabled())
    {
        return false;
    }
    auto record = logger.open_record(severity);
    if (!record)
    {
        return false;
    }
    logger.push_record(std::move(record), text);
    return true;
}

} // namespace

TEST(Logger, HasNothingEnabledAtTheStart)
{
    Logger logger("tests.start");
    EXPECT_EQ(logger.name(), "tests.start");
    EXPECT_EQ(logger.enabled_severities(), 0U);
    EXPECT_FALSE(logger.is_enabled(~0U));
}

TEST(Logger, EnablesEachBitOnItsOwn)
{
    Logger logger("tests.bits");
    logger.set_enabled_severities(parameter | 0x200);
    EXPECT_EQ(logger.enabled_severities(), 0x202U);
    EXPECT_TRUE(logger.is_enabled(parameter));
    EXPECT_TRUE(logger.is_enabled(0x200));
    EXPECT_FALSE(logger.is_enabled(diagnostic));
    logger.set_enabled_severities(0);
    EXPECT_FALSE(logger.is_enabled(parameter));
}

TEST(Logger, HandsTheSinksSeverityChannelAndMessage)
{
    const LogRecorder recorder;
    Logger logger("tests.record");
    logger.set_enabled_severities(parameter | diagnostic);
    EXPECT_TRUE(write(logger, diagnostic, "caf\xC3\xA9 \xFF"));
    EXPECT_TRUE(write(logger, parameter, ""));
    ASSERT_EQ(recorder.records().size(), 2U);
    EXPECT_EQ(recorder.records()[0].severity, diagnostic);
    EXPECT_EQ(recorder.records()[0].channel, "tests.record");
    EXPECT_EQ(recorder.records()[0].message, "caf\xC3\xA9 \xFF");
    EXPECT_EQ(recorder.records()[1].severity, parameter);
    EXPECT_EQ(recorder.records()[1].message, "");
}

TEST(Logger, WritesNothingOfADisabledSeverity)
{
    const LogRecorder recorder;
    Logger logger("tests.disabled");
    logger.set_enabled_severities(diagnostic);
    EXPECT_FALSE(write(logger, parameter, "text"));
    EXPECT_TRUE(recorder.records().empty());
}

TEST(Logger, WritesNothingWhenTheCoreIsSwitchedOff)
{
    const LogRecorder recorder;
    Logger logger("tests.off");
    logger.set_enabled_severities(diagnostic);
    EXPECT_TRUE(logger.is_logging_enabled());
    {
        const LoggingSwitchedOff off;
        EXPECT_FALSE(logger.is_logging_enabled());
        EXPECT_FALSE(static_cast<bool>(logger.open_record(diagnostic)));
        EXPECT_FALSE(write(logger, diagnostic, "text"));
    }
    EXPECT_TRUE(write(logger, diagnostic, "text"));
    EXPECT_EQ(recorder.records().size(), 1U);
}

TEST(Logger, DropsARecordThatIsNotPushed)
{
    const LogRecorder recorder;
    Logger logger("tests.dropped");
    {
        const auto record = logger.open_record(diagnostic);
        EXPECT_TRUE(static_cast<bool>(record));
    }
    EXPECT_TRUE(recorder.records().empty());
}

TEST(Logger, CountsTheScopesOfEachThreadApart)
{
    Logger logger("tests.depth");
    Logger other("tests.depth.other");
    EXPECT_EQ(logger.scope_depth(), 0);
    ++logger.scope_depth();
    ++logger.scope_depth();
    EXPECT_EQ(logger.scope_depth(), 2);
    EXPECT_EQ(other.scope_depth(), 0);
    int depthThere = -1;
    std::thread thread(
        [&logger, &depthThere]
        {
            depthThere = logger.scope_depth();
            ++logger.scope_depth();
        });
    thread.join();
    EXPECT_EQ(depthThere, 0);
    EXPECT_EQ(logger.scope_depth(), 2);
}

TEST(Logger, IsWrittenByManyThreadsAtOnce)
{
    constexpr int rounds = 200;
    const LogRecorder recorder;
    Logger logger("tests.threads");
    logger.set_enabled_severities(diagnostic);
    const auto writeMany = [&logger]
    {
        for (int round = 0; round < rounds; ++round)
        {
            write(logger, diagnostic, "text");
        }
    };
    std::thread one(writeMany);
    std::thread two(writeMany);
    one.join();
    two.join();
    EXPECT_EQ(recorder.records().size(), 2U * rounds);
}
