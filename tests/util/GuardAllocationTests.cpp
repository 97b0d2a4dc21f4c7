// SPDX-License-Identifier: MIT
// The guard, with each of its allocations failing in turn.
#include <new>

#include <git2.h>
#include <git2/sys/merge.h>
#include <gtest/gtest.h>

#include "support/FailingAllocations.hpp"
#include "support/LibGit2Session.hpp"
#include "vclink/git/LibGit2Guard.hpp"

namespace
{

TEST(GuardAllocation, ThatFailsLeavesLibGit2AsItWas)
{
    git_libgit2_init();
    {
        // The first one makes the logger as well.
        const vclink::git::LibGit2Guard guard;
    }
    const int before = vclink::test::countLibGit2Starts();
    bool hasFailed = true;
    int failures = 0;
    for (int count = 0; hasFailed && count < 100; ++count)
    {
        SCOPED_TRACE(count);
        bool isRefused = false;
        vclink::test::letAllocationsSucceed(count);
        try
        {
            const vclink::git::LibGit2Guard guard;
        }
        catch (const std::bad_alloc &)
        {
            isRefused = true;
        }
        hasFailed = vclink::test::letAllAllocationsSucceed();
        EXPECT_EQ(isRefused, hasFailed);
        EXPECT_EQ(vclink::test::countLibGit2Starts(), before);
        EXPECT_EQ(git_merge_driver_lookup("*"), nullptr);
        failures += hasFailed ? 1 : 0;
    }
    EXPECT_FALSE(hasFailed);
    EXPECT_GE(failures, 2);
    git_libgit2_shutdown();
}

} // namespace
