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

TEST(ScopeTrace, WritesItsSignatureAtEntryAndAtExitAndHoldsPathAndLine)
{
    const LogCapture log;
    {
        const ScopeTrace trace(logger(), tracedSignature, "folder/file", 12);
        EXPECT_THAT(log.records(), ElementsAre(isRecord(0x20, tracedSignature)));
        EXPECT_STREQ(trace.getPath(), "folder/file");
        EXPECT_EQ(trace.getLine(), 12u);
    }
    EXPECT_THAT(log.records(),
                ElementsAre(isRecord(0x20, tracedSignature), isRecord(0x40, tracedSignature)));
}

/// A host's output may indent each record by the count.
TEST(ScopeTrace, CountsTheOpenScopesAfterTheirEntryRecordAndBeforeTheirExitRecord)
{
    LogCapture log;
    std::vector<int> counts;
    log.onRecord([&counts](const test::LogRecord &) { counts.push_back(logger().scope_depth()); });
    {
        const ScopeTrace outer(logger(), "outer", "file", 1);
        const ScopeTrace inner(logger(), "inner", "file", 2);
        EXPECT_EQ(logger().scope_depth(), 2);
    }
    EXPECT_THAT(counts, ElementsAre(0, 1, 1, 0));
    EXPECT_EQ(logger().scope_depth(), 0);
    EXPECT_THAT(log.messages(), ElementsAre("outer", "inner", "inner", "outer"));
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

TEST(ScopeTrace, TellsThatAnExceptionPassesAlsoElsewhereOnTheThread)
{
    const LogCapture log;
    try
    {
        const TracesItsEnd tracesItsEnd;
        const ScopeTrace trace(logger(), "passed", "file", 1);
        throw std::runtime_error("passing");
    }
    catch (const std::runtime_error &)
    {
        EXPECT_EQ(logger().scope_depth(), 0);
    }
    EXPECT_THAT(log.messages(SeverityScopeExit),
                ElementsAre("passed [throw]", std::string(tracedSignature) + " [throw]"));
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

TEST(ScopeTrace, CountsAndEndsAlsoWhenItsEntryIsDisabledMeanwhileOrItsExitAllTheTime)
{
    LogCapture log;
    const auto recordsOf = [&log](unsigned atEntry, unsigned atExit)
    {
        log.clear();
        enable(atEntry);
        {
            const ScopeTrace trace(logger(), tracedSignature, "file", 1);
            EXPECT_EQ(logger().scope_depth(), 1);
            enable(atExit);
        }
        EXPECT_EQ(logger().scope_depth(), 0);
        return log.records();
    };
    EXPECT_THAT(recordsOf(LogCapture::allSeverities, SeverityScopeExit),
                ElementsAre(isRecord(0x20, tracedSignature), isRecord(0x40, tracedSignature)));
    EXPECT_THAT(recordsOf(SeverityScopeEntry, SeverityScopeEntry),
                ElementsAre(isRecord(0x20, tracedSignature)));
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
