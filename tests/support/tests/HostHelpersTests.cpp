// SPDX-License-Identifier: MIT
#include <string>

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
using vclink::test::LogCapture;

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
    Logger logger("vclink::test::one");
    Logger other("vclink::test::other");
    vclink_host::setEnabledSeverities("vclink::test::other", 0x02);
    const LogCapture capture(0x06, "vclink::test::one");
    write(logger, 0x02, "first");
    write(other, 0x02, "not mine");
    write(logger, 0x08, "not enabled");
    write(logger, 0x04, "second");
    const auto records = capture.records();
    ASSERT_EQ(records.size(), 2u);
    EXPECT_EQ(records[0].severity, 0x02u);
    EXPECT_EQ(records[0].channel, "vclink::test::one");
    EXPECT_EQ(records[0].message, "first");
    EXPECT_EQ(records[1].severity, 0x04u);
    EXPECT_THAT(capture.messages(), ElementsAre("first", "second"));
    EXPECT_THAT(capture.messages(0x04), ElementsAre("second"));
}

TEST(LogCapture, ForgetsWhatItIsToldToForget)
{
    Logger logger("vclink::test::cleared");
    LogCapture capture(0x02, "vclink::test::cleared");
    write(logger, 0x02, "first");
    capture.clear();
    write(logger, 0x02, "second");
    EXPECT_THAT(capture.messages(), ElementsAre("second"));
}

TEST(LogCapture, PutsBackTheSeverities)
{
    Logger logger("vclink::test::restored");
    vclink_host::setEnabledSeverities("vclink::test::restored", 0x10);
    {
        const LogCapture capture(0x02, "vclink::test::restored");
        EXPECT_EQ(logger.enabled_severities(), 0x02u);
    }
    EXPECT_EQ(logger.enabled_severities(), 0x10u);
}

TEST(Text, GoesBothWaysWithoutLoss)
{
    const std::string bytes = "a/\xc3\xa9\xff \xf0\x9f\x98\x80";
    EXPECT_EQ(vclink::test::asUtf8(vclink::test::asUtf16(bytes)), bytes);
    EXPECT_EQ(vclink::test::asBytes(vclink::test::asPath(bytes)), bytes);
    EXPECT_EQ(vclink::test::asUtf16("\xc3\xa9"), u"\u00e9");
    EXPECT_THAT(vclink::test::asPaths({"a", "b"}), ElementsAre(upath(u"a"), upath(u"b")));
}

TEST(TestInteractor, PassesOnARequestToCancel)
{
    vclink::test::TestInteractor interactor;
    vclink::PollableTerminator poller(interactor.getTerminator());
    EXPECT_FALSE(poller.checkAndResetCancelledState());
    interactor.cancel();
    EXPECT_TRUE(poller.checkAndResetCancelledState());
}

TEST(TestInteractor, RemembersProgress)
{
    vclink::test::TestInteractor interactor;
    interactor.getProgressReporter()->setProgress(0.5);
    interactor.getProgressReporter()->setProgressMessage(u"half");
    EXPECT_THAT(interactor.progress.fractions, ElementsAre(0.5));
    EXPECT_THAT(interactor.progress.messages, ElementsAre(ustring(u"half")));
}

} // namespace
