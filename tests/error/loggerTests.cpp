// SPDX-License-Identifier: MIT
#include "error/logging/logger.hpp"

#include <cstddef>
#include <cstdint>
#include <string>
#include <utility>
#include <vector>

#include <boost/log/core/core.hpp>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "error/CoreFilter.hpp"
#include "support/LogCapture.hpp"
#include "support/isRecord.hpp"
#include "vclink_host/logging.hpp"

namespace vclink::git
{
namespace
{

using test::CoreFilter;
using test::LogCapture;
using testing::ElementsAre;
using testing::IsEmpty;

static_assert(SeverityParameter == 0x02 && SeverityProgress == 0x04 && SeverityDiagnostic == 0x08 &&
              SeverityException == 0x10 && SeverityScopeEntry == 0x20 &&
              SeverityScopeExit == 0x40 && SeverityStackTrace == 0x200);

constexpr Severity everySeverity[] = {SeverityParameter, SeverityProgress,   SeverityDiagnostic,
                                      SeverityException, SeverityScopeEntry, SeverityScopeExit,
                                      SeverityStackTrace};

template <class... Values> std::vector<std::string> messagesOf(Values &&...values)
{
    const LogCapture log;
    writeRecord(SeverityDiagnostic, std::forward<Values>(values)...);
    return log.messages();
}

TEST(Logger, IsOneAndNamedAfterTheLibrary)
{
    EXPECT_EQ(logger().name(), "vclink::git");
    EXPECT_EQ(&logger(), &logger());
}

TEST(Logger, IsReachedByTheHostByItsName)
{
    const LogCapture log(0);
    vclink_host::setEnabledSeverities("vclink::git", SeverityProgress);
    EXPECT_EQ(logger().enabled_severities(), SeverityProgress);
    vclink_host::setEnabledSeverities("another", SeverityDiagnostic);
    EXPECT_EQ(logger().enabled_severities(), SeverityProgress);
}

TEST(Logger, WritesARecordWithItsSeverityAndNameAndNothingForADisabledOne)
{
    for (const Severity severity : everySeverity)
    {
        const LogCapture log(severity);
        for (const Severity other : everySeverity)
            writeRecord(other, "text");
        const auto records = log.records();
        EXPECT_THAT(records, ElementsAre(test::isRecord(severity, "text")));
        EXPECT_EQ(records[0].channel, "vclink::git");
    }
}

TEST(Logger, JoinsTheValuesWithNothingBetweenThem)
{
    const std::string text = "c";
    const char *const null = nullptr;
    EXPECT_THAT(messagesOf("a ", "b", text, 1, 2), ElementsAre("a bc12"));
    EXPECT_THAT(messagesOf(""), ElementsAre(""));
    EXPECT_THAT(messagesOf("\xFF\xC3(", "\n"), ElementsAre("\xFF\xC3(\n"));
    // Numbers in decimal.
    EXPECT_THAT(messagesOf(-7), ElementsAre("-7"));
    EXPECT_THAT(messagesOf(4'294'967'295u), ElementsAre("4294967295"));
    EXPECT_THAT(messagesOf(SIZE_MAX), ElementsAre("18446744073709551615"));
    EXPECT_THAT(messagesOf(std::int32_t{-31}), ElementsAre("-31"));
    // Nothing of a text that is null.
    EXPECT_THAT(messagesOf("url: ", null, ", type: ", 1), ElementsAre("url: , type: 1"));
    EXPECT_THAT(messagesOf([null] { return null; }), ElementsAre(""));
    // What a function returns.
    const auto three = [] { return 3; };
    EXPECT_THAT(messagesOf("<", three, ">"), ElementsAre("<3>"));
    EXPECT_THAT(messagesOf([] { return std::string("text"); }), ElementsAre("text"));
}

/// The steps of one write with a function for its text, in their order.
std::vector<std::string> stepsOfAWrite(bool isAccepted)
{
    std::vector<std::string> steps;
    const CoreFilter filter(
        [&steps, isAccepted](unsigned severity)
        {
            steps.push_back("filter " + std::to_string(severity));
            return isAccepted;
        });
    writeRecord(SeverityDiagnostic,
                [&steps]
                {
                    steps.emplace_back("text");
                    return "record";
                });
    return steps;
}

TEST(Logger, BuildsTheTextAfterTheRecordWasOpenedAndNoneThatNobodyWants)
{
    LogCapture log(SeverityDiagnostic);
    EXPECT_THAT(stepsOfAWrite(true), ElementsAre("filter 8", "text"));
    EXPECT_THAT(log.messages(), ElementsAre("record"));
    log.clear();
    EXPECT_THAT(stepsOfAWrite(false), ElementsAre("filter 8"));
    EXPECT_THAT(log.messages(), IsEmpty());
}

TEST(Logger, OpensNoRecordForADisabledSeverityOrWhenLoggingIsSwitchedOff)
{
    const LogCapture log(SeverityDiagnostic);
    boost::log::core::get()->set_logging_enabled(false);
    EXPECT_THAT(stepsOfAWrite(true), IsEmpty());
    boost::log::core::get()->set_logging_enabled(true);
    const LogCapture other(~static_cast<unsigned>(SeverityDiagnostic));
    EXPECT_THAT(stepsOfAWrite(true), IsEmpty());
}

TEST(Logger, MayBeWrittenToWhileATextIsBuilt)
{
    const LogCapture log(SeverityDiagnostic | SeverityStackTrace);
    writeRecord(SeverityDiagnostic,
                []
                {
                    writeRecord(SeverityStackTrace, "inner");
                    return "outer";
                });
    EXPECT_THAT(log.messages(), ElementsAre("inner", "outer"));
    EXPECT_THAT(log.messages(SeverityDiagnostic), ElementsAre("outer"));
}

} // namespace
} // namespace vclink::git
