// SPDX-License-Identifier: MIT
#include "options/CheckoutCallbacks.hpp"

#include <cstddef>
#include <cstdint>
#include <limits>
#include <stdexcept>
#include <string>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "error/CoreFilter.hpp"
#include "error/logging/severity.hpp"
#include "support/LocaleOfTheProcess.hpp"
#include "support/LogCapture.hpp"
#include "support/TestInteractor.hpp"
#include "support/isRecord.hpp"
#include "support/text.hpp"
#include "vclink/util/exception/CancelledOperationException.hpp"

namespace vclink::git
{
namespace
{

using test::CoreFilter;
using test::isRecord;
using test::LocaleOfTheProcess;
using test::LogCapture;
using test::ProgressCall;
using test::TestInteractor;
using testing::ElementsAre;
using testing::IsEmpty;
using vclink::util::exception::CancelledOperationException;

constexpr std::size_t greatest = std::numeric_limits<std::size_t>::max();

ProgressCall message(const ustring &text)
{
    return text;
}

/// An application whose progress display can be exchanged or lost.
class DisplayInteractor : public TestInteractor
{
  public:
    ProgressReporter *getProgressReporter() override
    {
        ++asked;
        if (isLost)
            throw std::runtime_error("no display");
        return reporter;
    }

    int asked = 0;
    bool isLost = false;
    ProgressReporter *reporter = &progress;
};

class CheckoutCallbacksTest : public testing::Test
{
  protected:
    int notify(git_checkout_notify_t why, const char *path)
    {
        return callbacks_.notifyProgress(why, path, nullptr, nullptr, nullptr);
    }
    int notifyOfNothing()
    {
        return notify(GIT_CHECKOUT_NOTIFY_NONE, nullptr);
    }
    /// The calls that one step of a checkout makes.
    std::vector<ProgressCall> callsOf(const char *path, std::size_t completed, std::size_t total)
    {
        interactor_.progress.calls.clear();
        callbacks_.checkoutProgress(path, completed, total);
        return interactor_.progress.calls;
    }

    DisplayInteractor interactor_;
    CheckoutCallbacks callbacks_{interactor_};
    LocaleOfTheProcess english_{"C"};
};

using CheckoutNotification = CheckoutCallbacksTest;
using CheckoutProgress = CheckoutCallbacksTest;
using CheckoutPerfData = CheckoutCallbacksTest;

TEST_F(CheckoutNotification, VetoesNothingWhateverTheReasonAndTheThreeFilesAndMovesNoProgress)
{
    // No place that could be read.
    const auto *const nowhere = reinterpret_cast<const git_diff_file *>(std::uintptr_t{8});
    for (const unsigned why : {0u, 1u, 2u, 4u, 8u, 16u, 0x8000u, 0xFFFFu})
        EXPECT_EQ(callbacks_.notifyProgress(static_cast<git_checkout_notify_t>(why), "file",
                                            nowhere, nowhere, nowhere),
                  0)
            << why;
    EXPECT_EQ(interactor_.asked, 0);
    EXPECT_THAT(interactor_.progress.calls, IsEmpty());
}

TEST_F(CheckoutNotification, TellsReasonAndPathInOneRecord)
{
    const LogCapture log;
    notify(GIT_CHECKOUT_NOTIFY_CONFLICT, "folder/file");
    notify(GIT_CHECKOUT_NOTIFY_IGNORED, "caf\xE9 (1)");
    notify(GIT_CHECKOUT_NOTIFY_ALL, "");
    EXPECT_EQ(notify(GIT_CHECKOUT_NOTIFY_DIRTY, nullptr), 0);
    EXPECT_THAT(log.records(),
                ElementsAre(isRecord(SeverityProgress, "Checkout Notify : 1 (folder/file)"),
                            isRecord(SeverityProgress, "Checkout Notify : 16 (caf\xE9 (1))"),
                            isRecord(SeverityProgress, "Checkout Notify : 65535 ()"),
                            isRecord(SeverityProgress, "Checkout Notify : 2 ()")));
}

TEST_F(CheckoutNotification, PollsBeforeAllElseAndForgetsARequestThatItHasSeen)
{
    const LogCapture log;
    interactor_.cancel();
    interactor_.cancel();
    EXPECT_THROW(notify(GIT_CHECKOUT_NOTIFY_UPDATED, "file"), CancelledOperationException);
    EXPECT_THAT(log.records(), IsEmpty());
    EXPECT_EQ(notifyOfNothing(), 0);
    interactor_.cancel();
    EXPECT_THROW(notifyOfNothing(), CancelledOperationException);
}

TEST_F(CheckoutProgress, TellsTheFractionAndThenTheFile)
{
    EXPECT_THAT(callsOf("folder/file", 1, 4),
                ElementsAre(0.25, message(u"Checking out folder/file")));
    EXPECT_THAT(callsOf("other", 4, 4), ElementsAre(1.0, message(u"Checking out other")));
    // Zero twice for a first step with a path.
    EXPECT_THAT(callsOf("file", 0, 3), ElementsAre(0.0, 0.0, message(u"Checking out file")));
    // What a path shares with placeholders.
    EXPECT_THAT(callsOf("%1% 100%", 1, 1), ElementsAre(1.0, message(u"Checking out %1% 100%")));
    // A path that is no UTF-8.
    EXPECT_THAT(callsOf("caf\xE9", 1, 1), ElementsAre(1.0, message(test::asUtf16("Checking out ") +
                                                                   test::asUtf16("caf\xE9"))));
    EXPECT_EQ(interactor_.progress.messages.back().back(), char16_t{0xDCE9});
}

TEST_F(CheckoutProgress, SetsZeroOnceForAFirstStepWithoutAPathOrATotalAndTellsNothingOfALaterOne)
{
    EXPECT_THAT(callsOf(nullptr, 0, 3), ElementsAre(ProgressCall(0.0)));
    EXPECT_THAT(callsOf("", 0, 3), ElementsAre(ProgressCall(0.0)));
    EXPECT_THAT(callsOf(nullptr, 0, 0), ElementsAre(ProgressCall(0.0)));
    EXPECT_THAT(callsOf("file", 0, 0), ElementsAre(ProgressCall(0.0)));
    EXPECT_THAT(callsOf(nullptr, 2, 3), IsEmpty());
    EXPECT_THAT(callsOf("", 2, 3), IsEmpty());
    EXPECT_THAT(callsOf("file", 2, 0), IsEmpty());
    EXPECT_THAT(callsOf(nullptr, greatest, 0), IsEmpty());
}

TEST_F(CheckoutProgress, DividesOverTheWholeRangeAndLeavesAFractionAboveOneAsItIs)
{
    const std::size_t half = greatest / 2 + 1;
    EXPECT_EQ(callsOf("f", greatest, greatest).front(), ProgressCall(1.0));
    EXPECT_EQ(callsOf("f", half, greatest).front(), ProgressCall(0.5));
    EXPECT_EQ(callsOf("f", greatest, 1).front(), ProgressCall(18446744073709551616.0));
    EXPECT_EQ(callsOf("f", 1, greatest).front(), ProgressCall(1.0 / 18446744073709551616.0));
    EXPECT_EQ(callsOf("f", 3, 2).front(), ProgressCall(1.5));
}

TEST_F(CheckoutProgress, SpeaksTheLanguageOfTheMoment)
{
    const LocaleOfTheProcess german("de_DE.UTF-8");
    EXPECT_THAT(callsOf("Z\xC3\xBCrich", 1, 2),
                ElementsAre(0.5, message(u"Z\u00FCrich wird ausgecheckt")));
    const LocaleOfTheProcess japanese("ja");
    EXPECT_THAT(callsOf("\xE6\x9D\xB1", 1, 2),
                ElementsAre(0.5, message(u"\u6771 をチェックアウトしています")));
}

TEST_F(CheckoutProgress, TellsItsArgumentsInOneRecord)
{
    const LogCapture log;
    callsOf("folder/file", 2, 5);
    callsOf(nullptr, 0, 3);
    callsOf("", greatest, 0);
    EXPECT_THAT(
        log.records(),
        ElementsAre(
            isRecord(SeverityParameter, " pathStr=folder/file completed_steps=2 total_steps=5"),
            isRecord(SeverityParameter, " pathStr= completed_steps=0 total_steps=3"),
            isRecord(SeverityParameter,
                     " pathStr= completed_steps=18446744073709551615 total_steps=0")));
}

TEST_F(CheckoutProgress, AsksForTheDisplayAtEachStepBeforeAllElse)
{
    test::RecordingProgressReporter other;
    callsOf("file", 1, 2);
    interactor_.reporter = &other;
    EXPECT_THAT(callsOf("file", 2, 2), IsEmpty());
    EXPECT_THAT(other.calls, ElementsAre(1.0, message(u"Checking out file")));
    EXPECT_EQ(interactor_.asked, 2);
    const LogCapture log;
    interactor_.isLost = true;
    EXPECT_THROW(callbacks_.checkoutProgress("file", 1, 2), std::runtime_error);
    EXPECT_THAT(log.records(), IsEmpty());
}

TEST_F(CheckoutProgress, OnlyWritesItsRecordsWithoutADisplay)
{
    const LogCapture log;
    interactor_.reporter = nullptr;
    EXPECT_THAT(callsOf("file", 0, 2), IsEmpty());
    EXPECT_THAT(callsOf("file", 2, 2), IsEmpty());
    EXPECT_THAT(callsOf(nullptr, 0, 0), IsEmpty());
    EXPECT_EQ(interactor_.asked, 3);
    EXPECT_THAT(log.messages(), ElementsAre(" pathStr=file completed_steps=0 total_steps=2",
                                            " pathStr=file completed_steps=2 total_steps=2",
                                            " pathStr= completed_steps=0 total_steps=0"));
}

TEST_F(CheckoutProgress, RaisesWhatTheDisplayRaisesWithItsRecordWritten)
{
    const LogCapture log;
    interactor_.progress.onCall = [](std::size_t) { throw std::runtime_error("display"); };
    EXPECT_THROW(callsOf("file", 0, 3), std::runtime_error);
    EXPECT_THAT(interactor_.progress.calls, ElementsAre(ProgressCall(0.0)));
    EXPECT_THAT(log.messages(), ElementsAre(" pathStr=file completed_steps=0 total_steps=3"));
}

TEST_F(CheckoutProgress, DoesNotPoll)
{
    interactor_.cancel();
    EXPECT_EQ(callsOf("file", 1, 2).size(), 2u);
    EXPECT_THROW(notifyOfNothing(), CancelledOperationException);
}

git_checkout_perfdata makePerfData()
{
    git_checkout_perfdata data = {};
    data.mkdir_calls = 2;
    data.stat_calls = greatest;
    data.chmod_calls = 1;
    return data;
}

TEST_F(CheckoutPerfData, TellsTheCountsInOneRecordAndNeitherReachesTheHostNorPolls)
{
    const LogCapture log;
    interactor_.cancel();
    const git_checkout_perfdata data = makePerfData();
    EXPECT_NO_THROW(callbacks_.perfData(&data));
    EXPECT_THAT(log.records(),
                ElementsAre(isRecord(SeverityProgress, "Calls to chmod / mkdir / stat : 1 / 2 / "
                                                       "18446744073709551615")));
    EXPECT_EQ(interactor_.asked, 0);
    EXPECT_THAT(interactor_.progress.calls, IsEmpty());
    EXPECT_THROW(notifyOfNothing(), CancelledOperationException);
}

/// How many records `call` begins while those of this severity are off.
template <class Call> int recordsBegunWithout(unsigned severity, Call call)
{
    const LogCapture log(~severity);
    int begun = 0;
    const CoreFilter filter([&begun](unsigned) { return ++begun > 0; });
    call();
    EXPECT_THAT(log.records(), IsEmpty());
    return begun;
}

TEST_F(CheckoutCallbacksTest, BeginNoRecordWhoseSeverityIsOff)
{
    const git_checkout_perfdata data = makePerfData();
    EXPECT_EQ(recordsBegunWithout(SeverityProgress, [&] { notifyOfNothing(); }), 0);
    EXPECT_EQ(recordsBegunWithout(SeverityProgress, [&] { callbacks_.perfData(&data); }), 0);
    EXPECT_EQ(recordsBegunWithout(SeverityParameter, [&] { callsOf("file", 1, 1); }), 0);
}

} // namespace
} // namespace vclink::git
