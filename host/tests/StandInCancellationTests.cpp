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

TEST(StandInCancellation, IsRememberedUntilItIsPolled)
{
    Terminator source;
    PollableTerminator poller(source);
    requestCancellation(source);
    requestCancellation(source);
    EXPECT_TRUE(poller.checkAndResetCancelledState());
    EXPECT_FALSE(poller.checkAndResetCancelledState());
    requestCancellation(source);
    EXPECT_TRUE(poller.checkAndResetCancelledState());
}

TEST(StandInCancellation, IsRememberedByEachPollerForItself)
{
    Terminator source;
    PollableTerminator one(source);
    PollableTerminator two(source);
    requestCancellation(source);
    EXPECT_TRUE(one.checkAndResetCancelledState());
    EXPECT_FALSE(one.checkAndResetCancelledState());
    EXPECT_TRUE(two.checkAndResetCancelledState());
}

TEST(StandInCancellation, IsNotRememberedByAPollerThatComesLater)
{
    Terminator source;
    requestCancellation(source);
    PollableTerminator poller(source);
    EXPECT_FALSE(poller.checkAndResetCancelledState());
}

TEST(StandInCancellation, OfOneSourceIsNotSeenAtAnother)
{
    Terminator source;
    Terminator other;
    PollableTerminator poller(other);
    requestCancellation(source);
    EXPECT_FALSE(poller.checkAndResetCancelledState());
}

TEST(StandInCancellation, OutlivesItsSource)
{
    auto source = std::make_unique<Terminator>();
    PollableTerminator told(*source);
    PollableTerminator untold(*source);
    requestCancellation(*source);
    EXPECT_TRUE(untold.checkAndResetCancelledState());
    source.reset();
    EXPECT_TRUE(told.checkAndResetCancelledState());
    EXPECT_FALSE(untold.checkAndResetCancelledState());
}

TEST(StandInCancellation, IsAskedForWithoutAPoller)
{
    Terminator source;
    {
        PollableTerminator gone(source);
    }
    requestCancellation(source);
    PollableTerminator poller(source);
    EXPECT_FALSE(poller.checkAndResetCancelledState());
}

TEST(StandInCancellation, IsSeenWhenAnotherThreadAsks)
{
    Terminator source;
    PollableTerminator poller(source);
    std::thread asking([&source] { requestCancellation(source); });
    const auto limit = std::chrono::steady_clock::now() + std::chrono::seconds(30);
    bool isSeen = false;
    while (!isSeen && std::chrono::steady_clock::now() < limit)
    {
        isSeen = poller.checkAndResetCancelledState();
    }
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
            {
                requestCancellation(source);
            }
        });
    for (int round = 0; round < 500; ++round)
    {
        PollableTerminator poller(source);
        poller.checkAndResetCancelledState();
    }
    isDone = true;
    asking.join();
    PollableTerminator poller(source);
    EXPECT_FALSE(poller.checkAndResetCancelledState());
}
