// SPDX-License-Identifier: MIT
// A merge through a command, with each of its allocations failing in turn.
#include <exception>
#include <filesystem>
#include <iterator>
#include <new>
#include <utility>

#include <git2.h>
#include <git2/sys/merge.h>
#include <gtest/gtest.h>

#include "MergeDriverFixture.hpp"
#include "error/errorUtil/callbackException.hpp"
#include "support/FailingAllocations.hpp"
#include "vclink/git/LibGit2Guard.hpp"

namespace
{

class MergeDriverAllocation : public vclink::test::MergeDriverFixture
{
  protected:
    /// Merges while one allocation fails.
    /// @return whether it has
    bool mergeWithFailingAllocation(int allocationsBefore) const
    {
        const vclink::test::NothingLeft check(environment().temporary());
        const vclink::test::OpenedMerge opened(repository_);
        vclink::test::letAllocationsSucceed(allocationsBefore);
        const int code = opened.run();
        const bool hasFailed = vclink::test::letAllAllocationsSucceed();
        std::exception_ptr exception;
        std::swap(exception, vclink::git::pendingCallbackException());
        EXPECT_TRUE(code == 0 || code == GIT_EUSER) << code;
        EXPECT_EQ(code == GIT_EUSER, exception != nullptr);
        // A merge that is done has only its files to remove: one that can't be stays.
        const auto files = std::filesystem::directory_iterator(environment().temporary());
        EXPECT_LE(std::distance(begin(files), end(files)), code == 0 && hasFailed ? 1 : 0);
        for (const auto &file : std::filesystem::directory_iterator(environment().temporary()))
            std::filesystem::remove(file);
        if (exception != nullptr)
        {
            EXPECT_TRUE(hasFailed);
            EXPECT_THROW(std::rethrow_exception(exception), std::bad_alloc);
        }
        return hasFailed;
    }
};

TEST_F(MergeDriverAllocation, ThatFailsComesOutOfTheMergeAndLeavesNothing)
{
    makeConflict();
    defineScript("tool", "echo merged >\"$2\"");
    bool hasFailed = true;
    int failures = 0;
    for (int count = 0; hasFailed && count < 2000; ++count)
    {
        SCOPED_TRACE(count);
        hasFailed = mergeWithFailingAllocation(count);
        failures += hasFailed ? 1 : 0;
    }
    EXPECT_FALSE(hasFailed);
    EXPECT_GE(failures, 20);
    EXPECT_EQ(staged("file"), "merged\n");
}

/// libgit2's own count of its starts.
int countStarts()
{
    const int count = git_libgit2_init() - 1;
    git_libgit2_shutdown();
    return count;
}

TEST(GuardAllocation, ThatFailsLeavesLibGit2AsItWas)
{
    git_libgit2_init();
    {
        // The first one makes the logger as well.
        const vclink::git::LibGit2Guard guard;
    }
    const int before = countStarts();
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
        EXPECT_EQ(countStarts(), before);
        EXPECT_EQ(git_merge_driver_lookup("*"), nullptr);
        failures += hasFailed ? 1 : 0;
    }
    EXPECT_FALSE(hasFailed);
    EXPECT_GE(failures, 2);
    git_libgit2_shutdown();
}

} // namespace
