// SPDX-License-Identifier: MIT
#include <cstddef>
#include <string>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "foundation/core/log/basic_diagnostic_logger.hpp"
#include "support/LogCapture.hpp"
#include "support/TestInteractor.hpp"
#include "support/text.hpp"
#include "vclink/PollableTerminator.hpp"
#include "vclink_host/logging.hpp"

namespace
{

using testing::ElementsAre;
using namespace vclink::test;

using Logger = foundation::core::log::basic_diagnostic_logger<char>;

void write(Logger &logger, unsigned severity, const std::string &text)
{
    if (!logger.is_enabled(severity))
        return;
    if (auto record = logger.open_record(severity))
        logger.push_record(std::move(record), text);
}

TEST(LogCapture, CollectsTheRecordsOfItsLoggerInOrder)
{
    Logger logger("one");
    Logger other("other");
    vclink_host::setEnabledSeverities("other", 0x02);
    const LogCapture capture(0x06, "one");
    write(logger, 0x02, "first");
    write(other, 0x02, "not mine");
    write(logger, 0x08, "not enabled");
    write(logger, 0x04, "second");
    const auto records = capture.records();
    ASSERT_EQ(records.size(), 2u);
    EXPECT_EQ(records[0].severity, 0x02u);
    EXPECT_EQ(records[0].channel, "one");
    EXPECT_EQ(records[0].message, "first");
    EXPECT_EQ(records[1].severity, 0x04u);
    EXPECT_THAT(capture.messages(), ElementsAre("first", "second"));
    EXPECT_THAT(capture.messages(0x04), ElementsAre("second"));
}

TEST(LogCapture, TellsOfEachRecordForgetsOnRequestAndPutsBackTheSeverities)
{
    Logger logger("told");
    vclink_host::setEnabledSeverities("told", 0x10);
    {
        LogCapture capture(0x02, "told");
        EXPECT_EQ(logger.enabled_severities(), 0x02u);
        write(logger, 0x02, "first");
        capture.clear();
        std::vector<std::string> told;
        capture.onRecord([&told](const LogRecord &record) { told.push_back(record.message); });
        write(logger, 0x02, "second");
        EXPECT_THAT(told, ElementsAre("second"));
        EXPECT_THAT(capture.messages(), ElementsAre("second"));
    }
    EXPECT_EQ(logger.enabled_severities(), 0x10u);
}

TEST(Text, GoesBothWaysWithoutLoss)
{
    const std::string bytes = "a/\xc3\xa9\xff \xf0\x9f\x98\x80";
    EXPECT_EQ(asUtf8(asUtf16(bytes)), bytes);
    EXPECT_EQ(asBytes(asPath(bytes)), bytes);
    EXPECT_EQ(asUtf16("\xc3\xa9"), u"\u00e9");
    EXPECT_THAT(asPaths({"a", "b"}), ElementsAre(upath(u"a"), upath(u"b")));
}

TEST(TestInteractor, PassesOnARequestToCancelAndWhatIsRaisedAndRemembersProgress)
{
    TestInteractor interactor;
    vclink::PollableTerminator poller(interactor.getTerminator());
    EXPECT_FALSE(poller.checkAndResetCancelledState());
    interactor.cancel();
    EXPECT_TRUE(poller.checkAndResetCancelledState());
    std::vector<std::size_t> numbers;
    interactor.progress.onCall = [&numbers](std::size_t number)
    {
        numbers.push_back(number);
        if (number == 2)
            throw number;
    };
    interactor.getProgressReporter()->setProgress(0.5);
    EXPECT_THROW(interactor.getProgressReporter()->setProgressMessage(u"half"), std::size_t);
    interactor.getProgressReporter()->setProgress(1.0);
    EXPECT_THAT(numbers, ElementsAre(1u, 2u, 3u));
    EXPECT_THAT(interactor.progress.fractions, ElementsAre(0.5, 1.0));
    EXPECT_THAT(interactor.progress.messages, ElementsAre(ustring(u"half")));
    EXPECT_THAT(interactor.progress.calls,
                ElementsAre(ProgressCall(0.5), ProgressCall(ustring(u"half")), ProgressCall(1.0)));
}

} // namespace
