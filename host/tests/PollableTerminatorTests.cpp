// SPDX-License-Identifier: MIT
#include <gtest/gtest.h>

#include "vclink/PollableTerminator.hpp"

TEST(PollableTerminator, HasNothingToTellBeforeARequest)
{
    vclink::Terminator source;
    vclink::PollableTerminator poller(source);
    EXPECT_FALSE(poller.checkAndResetCancelledState());
    EXPECT_FALSE(poller.checkAndResetCancelledState());
}

TEST(PollableTerminator, AttachesToASourceAsOftenAsItIsAsked)
{
    vclink::Terminator source;
    for (int round = 0; round < 3; ++round)
    {
        vclink::PollableTerminator one(source);
        vclink::PollableTerminator two(source);
        EXPECT_FALSE(one.checkAndResetCancelledState());
        EXPECT_FALSE(two.checkAndResetCancelledState());
    }
}
