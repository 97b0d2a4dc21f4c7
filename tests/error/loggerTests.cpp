// SPDX-License-Identifier: MIT
#include "error/logging/logger.hpp"

#include <cstddef>
#include <cstdint>
#include <functional>
#include <string>
#include <utility>
#include <vector>

#include <boost/log/core/core.hpp>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "error/CoreFilter.hpp"
#include "support/LogCapture.hpp"
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

/// Switches Boost.Log off for the life of the object.
class LoggingDisabled
{
  public:
    LoggingDisabled()
    {
        boost::log::core::get()->set_logging_enabled(false);
    }
    LoggingDisabled(const LoggingDisabled &) = delete;
    LoggingDisabled &operator=(const LoggingDisabled &) = delete;
    ~LoggingDisabled()
    {
        boost::log::core::get()->set_logging_enabled(true);
    }
};

std::vector<std::string> messageOf(const std::function<void()> &write)
{
    const LogCapture log;
    write();
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

TEST(Logger, WritesARecordWithItsSeverityAndName)
{
    for (const Severity severity : everySeverity)
    {
        const LogCapture log(severity);
        writeRecord(severity, "text");
        const auto records = log.records();
        ASSERT_EQ(records.size(), 1u) << severity;
        EXPECT_EQ(records[0].severity, static_cast<unsigned>(severity));
        EXPECT_EQ(records[0].channel, "vclink::git");
        EXPECT_EQ(records[0].message, "text");
    }
}

TEST(Logger, WritesNothingForASeverityThatIsDisabled)
{
    for (const Severity severity : everySeverity)
    {
        const LogCapture log(~static_cast<unsigned>(severity));
        writeRecord(severity, "text");
        EXPECT_THAT(log.records(), IsEmpty()) << severity;
    }
}

TEST(Logger, JoinsTheValuesWithNothingBetweenThem)
{
    const std::string text = "c";
    EXPECT_THAT(messageOf([&text] { writeRecord(SeverityDiagnostic, "a ", "b", text, 1, 2); }),
                ElementsAre("a bc12"));
    EXPECT_THAT(messageOf([] { writeRecord(SeverityDiagnostic, ""); }), ElementsAre(""));
}

TEST(Logger, WritesNumbersInDecimal)
{
    EXPECT_THAT(messageOf([] { writeRecord(SeverityDiagnostic, -7); }), ElementsAre("-7"));
    EXPECT_THAT(messageOf([] { writeRecord(SeverityDiagnostic, 4'294'967'295u); }),
                ElementsAre("4294967295"));
    EXPECT_THAT(messageOf([] { writeRecord(SeverityDiagnostic, SIZE_MAX); }),
                ElementsAre("18446744073709551615"));
    EXPECT_THAT(messageOf([] { writeRecord(SeverityDiagnostic, std::int32_t{-31}); }),
                ElementsAre("-31"));
}

TEST(Logger, WritesNothingForANullText)
{
    const char *const null = nullptr;
    EXPECT_THAT(
        messageOf([null] { writeRecord(SeverityDiagnostic, "url: ", null, ", type: ", 1); }),
        ElementsAre("url: , type: 1"));
    EXPECT_THAT(messageOf([null] { writeRecord(SeverityDiagnostic, [null] { return null; }); }),
                ElementsAre(""));
}

TEST(Logger, WritesWhatAFunctionReturns)
{
    EXPECT_THAT(messageOf(
                    []
                    {
                        writeRecord(
                            SeverityDiagnostic, "<", [] { return 3; }, ">");
                    }),
                ElementsAre("<3>"));
    EXPECT_THAT(
        messageOf([] { writeRecord(SeverityDiagnostic, [] { return std::string("text"); }); }),
        ElementsAre("text"));
}

TEST(Logger, KeepsBytesAsTheyAre)
{
    EXPECT_THAT(messageOf([] { writeRecord(SeverityDiagnostic, "\xFF\xC3(", "\n"); }),
                ElementsAre("\xFF\xC3(\n"));
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

TEST(Logger, BuildsTheTextAfterTheRecordWasOpened)
{
    const LogCapture log(SeverityDiagnostic);
    EXPECT_THAT(stepsOfAWrite(true), ElementsAre("filter 8", "text"));
    EXPECT_THAT(log.messages(), ElementsAre("record"));
}

TEST(Logger, BuildsNoTextWhenNobodyWantsTheRecord)
{
    const LogCapture log(SeverityDiagnostic);
    EXPECT_THAT(stepsOfAWrite(false), ElementsAre("filter 8"));
    EXPECT_THAT(log.messages(), IsEmpty());
}

TEST(Logger, OpensNoRecordForADisabledSeverity)
{
    const LogCapture log(~static_cast<unsigned>(SeverityDiagnostic));
    EXPECT_THAT(stepsOfAWrite(true), IsEmpty());
}

TEST(Logger, OpensNoRecordWhenLoggingIsSwitchedOff)
{
    const LogCapture log(SeverityDiagnostic);
    const LoggingDisabled disabled;
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
