// SPDX-License-Identifier: MIT
#include "error/logging/ScopeTrace.hpp"

#include <stdexcept>
#include <string>
#include <type_traits>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "support/LogCapture.hpp"
#include "support/isRecord.hpp"

namespace vclink::git
{
namespace
{

using test::isRecord;
using test::LogCapture;
using testing::ElementsAre;
using testing::IsEmpty;

static_assert(!std::is_copy_constructible_v<ScopeTrace> && !std::is_copy_assignable_v<ScopeTrace>);

constexpr const char *tracedSignature = "void traced(int)";

void enable(unsigned severities)
{
    logger().set_enabled_severities(severities);
}

TEST(ScopeTrace, WritesItsSignatureAtEntryAndAtExit)
{
    const LogCapture log;
    {
        const ScopeTrace trace(logger(), tracedSignature, "folder/file", 12);
        EXPECT_THAT(log.records(), ElementsAre(isRecord(0x20, tracedSignature)));
    }
    EXPECT_THAT(log.records(),
                ElementsAre(isRecord(0x20, tracedSignature), isRecord(0x40, tracedSignature)));
}

TEST(ScopeTrace, HoldsPathAndLine)
{
    const ScopeTrace trace(logger(), tracedSignature, "folder/file", 12);
    EXPECT_STREQ(trace.getPath(), "folder/file");
    EXPECT_EQ(trace.getLine(), 12u);
}

TEST(ScopeTrace, CountsTheScopesThatAreOpen)
{
    const LogCapture log;
    EXPECT_EQ(logger().scope_depth(), 0);
    {
        const ScopeTrace outer(logger(), "outer", "file", 1);
        EXPECT_EQ(logger().scope_depth(), 1);
        {
            const ScopeTrace inner(logger(), "inner", "file", 2);
            EXPECT_EQ(logger().scope_depth(), 2);
        }
        EXPECT_EQ(logger().scope_depth(), 1);
    }
    EXPECT_EQ(logger().scope_depth(), 0);
    EXPECT_THAT(log.messages(), ElementsAre("outer", "inner", "inner", "outer"));
}

/// A host's output may indent each record by the count.
TEST(ScopeTrace, CountsAfterItsEntryRecordAndBeforeItsExitRecord)
{
    LogCapture log;
    std::vector<int> counts;
    log.onRecord([&counts](const test::LogRecord &) { counts.push_back(logger().scope_depth()); });
    {
        const ScopeTrace outer(logger(), "outer", "file", 1);
        const ScopeTrace inner(logger(), "inner", "file", 2);
    }
    EXPECT_THAT(counts, ElementsAre(0, 1, 1, 0));
}

TEST(ScopeTrace, TellsThatAnExceptionPasses)
{
    const LogCapture log;
    try
    {
        const ScopeTrace trace(logger(), tracedSignature, "file", 1);
        throw std::runtime_error("passing");
    }
    catch (const std::runtime_error &)
    {
        EXPECT_EQ(logger().scope_depth(), 0);
    }
    EXPECT_THAT(log.messages(SeverityScopeExit),
                ElementsAre(std::string(tracedSignature) + " [throw]"));
}

TEST(ScopeTrace, TellsNoExceptionInsideAHandler)
{
    const LogCapture log;
    try
    {
        throw std::runtime_error("caught");
    }
    catch (const std::runtime_error &)
    {
        const ScopeTrace trace(logger(), tracedSignature, "file", 1);
    }
    EXPECT_THAT(log.messages(SeverityScopeExit), ElementsAre(tracedSignature));
}

/// Opens a scope when it is destroyed.
struct TracesItsEnd
{
    ~TracesItsEnd()
    {
        const ScopeTrace trace(logger(), tracedSignature, "file", 1);
    }
};

TEST(ScopeTrace, TellsAnExceptionThatPassesElsewhereOnTheThread)
{
    const LogCapture log;
    try
    {
        const TracesItsEnd tracesItsEnd;
        throw std::runtime_error("passing");
    }
    catch (const std::runtime_error &)
    {
        EXPECT_THAT(log.messages(SeverityScopeExit),
                    ElementsAre(std::string(tracedSignature) + " [throw]"));
    }
}

TEST(ScopeTrace, DoesNothingWhenItsEntryIsDisabled)
{
    const LogCapture log(~static_cast<unsigned>(SeverityScopeEntry));
    {
        const ScopeTrace trace(logger(), tracedSignature, "file", 1);
        EXPECT_EQ(logger().scope_depth(), 0);
        enable(LogCapture::allSeverities);
    }
    EXPECT_EQ(logger().scope_depth(), 0);
    EXPECT_THAT(log.records(), IsEmpty());
}

TEST(ScopeTrace, StillEndsWhenItsEntryIsDisabledMeanwhile)
{
    const LogCapture log;
    {
        const ScopeTrace trace(logger(), tracedSignature, "file", 1);
        EXPECT_EQ(logger().scope_depth(), 1);
        enable(SeverityScopeExit);
    }
    EXPECT_EQ(logger().scope_depth(), 0);
    EXPECT_THAT(log.records(),
                ElementsAre(isRecord(0x20, tracedSignature), isRecord(0x40, tracedSignature)));
}

TEST(ScopeTrace, CountsWithoutARecordWhenOnlyItsExitIsDisabled)
{
    const LogCapture log(SeverityScopeEntry);
    {
        const ScopeTrace trace(logger(), tracedSignature, "file", 1);
        EXPECT_EQ(logger().scope_depth(), 1);
    }
    EXPECT_EQ(logger().scope_depth(), 0);
    EXPECT_THAT(log.records(), ElementsAre(isRecord(0x20, tracedSignature)));
}

TEST(ScopeTrace, TracesTheLoggerThatItIsGiven)
{
    Logger other("another logger");
    const LogCapture log(LogCapture::allSeverities, "another logger");
    const LogCapture own;
    {
        const ScopeTrace trace(other, tracedSignature, "file", 1);
        EXPECT_EQ(other.scope_depth(), 1);
        EXPECT_EQ(logger().scope_depth(), 0);
    }
    EXPECT_EQ(other.scope_depth(), 0);
    EXPECT_THAT(log.messages(), ElementsAre(tracedSignature, tracedSignature));
    EXPECT_THAT(own.messages(), IsEmpty());
}

} // namespace
} // namespace vclink::git
