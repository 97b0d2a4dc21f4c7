// SPDX-License-Identifier: MIT
#include <atomic>
#include <chrono>
#include <memory>
#include <thread>

#include <gtest/gtest.h>

#include "vclink/PollableTerminator.hpp"
#include "vclink_host/cancellation.hpp"

using vclink::PollableTerminator;
using vclink::Terminator;
using vclink_host::requestCancellation;

namespace
{

/// The first poll, and the one after it.
void expectPolls(PollableTerminator &poller, bool first)
{
    EXPECT_EQ(poller.checkAndResetCancelledState(), first);
    EXPECT_FALSE(poller.checkAndResetCancelledState());
}

TEST(StandInCancellation, IsRememberedUntilItIsPolledByEachPollerForItself)
{
    Terminator source;
    PollableTerminator one(source);
    PollableTerminator two(source);
    requestCancellation(source);
    requestCancellation(source);
    expectPolls(one, true);
    expectPolls(two, true);
    requestCancellation(source);
    expectPolls(one, true);
}

TEST(StandInCancellation, IsNotRememberedByAPollerThatComesLaterOrIsOfAnotherSource)
{
    Terminator source;
    Terminator other;
    PollableTerminator ofOther(other);
    requestCancellation(source);
    PollableTerminator later(source);
    expectPolls(ofOther, false);
    expectPolls(later, false);
}

TEST(StandInCancellation, OutlivesItsSource)
{
    auto source = std::make_unique<Terminator>();
    PollableTerminator told(*source);
    PollableTerminator untold(*source);
    requestCancellation(*source);
    EXPECT_TRUE(untold.checkAndResetCancelledState());
    source.reset();
    expectPolls(told, true);
    expectPolls(untold, false);
}

TEST(StandInCancellation, IsAskedForWithoutAPoller)
{
    Terminator source;
    {
        const PollableTerminator gone(source);
    }
    requestCancellation(source);
    PollableTerminator poller(source);
    expectPolls(poller, false);
}

TEST(StandInCancellation, IsSeenWhenAnotherThreadAsks)
{
    Terminator source;
    PollableTerminator poller(source);
    std::thread asking([&source] { requestCancellation(source); });
    const auto limit = std::chrono::steady_clock::now() + std::chrono::seconds(30);
    bool isSeen = false;
    while (!isSeen && std::chrono::steady_clock::now() < limit)
        isSeen = poller.checkAndResetCancelledState();
    asking.join();
    EXPECT_TRUE(isSeen);
}

TEST(StandInCancellation, IsAskedForWhilePollersComeAndGo)
{
    Terminator source;
    std::atomic<bool> isDone(false);
    std::thread asking(
        [&source, &isDone]
        {
            while (!isDone)
                requestCancellation(source);
        });
    for (int round = 0; round < 500; ++round)
        PollableTerminator(source).checkAndResetCancelledState();
    isDone = true;
    asking.join();
    PollableTerminator poller(source);
    expectPolls(poller, false);
}

} // namespace
