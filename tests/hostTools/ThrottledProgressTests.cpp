// SPDX-License-Identifier: MIT
#include "hostTools.hpp"

#include <chrono>
#include <thread>
#include <utility>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "vclink/PollableTerminator.hpp"
#include "vclink_host/cancellation.hpp"

namespace
{

using host_tools::ThrottledProgress;
using testing::ElementsAre;
using testing::Pair;

class Throttled : public testing::Test
{
  protected:
    ThrottledProgress::Show show()
    {
        return [this](double fraction, const ustring &message)
        { shown_.emplace_back(fraction, message); };
    }

    std::vector<std::pair<double, ustring>> shown_;
};

TEST_F(Throttled, ShowsTheFirstReportAndTheEnd)
{
    ThrottledProgress progress(show(), std::chrono::hours(1));
    EXPECT_FALSE(progress.hasBegun());
    progress.setProgress(0.0);
    EXPECT_TRUE(progress.hasBegun());
    for (int file = 1; file < 100; ++file)
    {
        progress.setProgress(file / 100.0);
        progress.setProgressMessage(u"file");
    }
    progress.setProgress(1.0);
    EXPECT_THAT(shown_, ElementsAre(Pair(0.0, ustring()), Pair(1.0, ustring(u"file"))));
}

TEST_F(Throttled, ShowsWhatCameLastWhenTheIntervalIsOver)
{
    ThrottledProgress progress(show(), std::chrono::milliseconds(1));
    progress.setProgress(0.0);
    progress.setProgressMessage(u"first");
    progress.setProgressMessage(u"second");
    std::this_thread::sleep_for(std::chrono::milliseconds(2));
    progress.setProgress(0.5);
    EXPECT_THAT(shown_.back(), Pair(0.5, ustring(u"second")));
}

TEST_F(Throttled, ShowsEverythingWithoutAnInterval)
{
    ThrottledProgress progress(show(), {});
    progress.setProgress(0.0);
    progress.setProgressMessage(u"file");
    progress.setProgress(0.25);
    EXPECT_EQ(shown_.size(), 3u);
}

TEST_F(Throttled, IsWhatTheInteractorOfAnOperationReportsTo)
{
    host_tools::Interactor interactor(show());
    EXPECT_FALSE(interactor.isWriting());
    interactor.getProgressReporter()->setProgress(0.0);
    EXPECT_TRUE(interactor.isWriting());
    EXPECT_EQ(shown_.size(), 1u);
    vclink::PollableTerminator poller(interactor.getTerminator());
    vclink_host::requestCancellation(interactor.getTerminator());
    EXPECT_TRUE(poller.checkAndResetCancelledState());
}

} // namespace
