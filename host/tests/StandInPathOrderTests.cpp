// SPDX-License-Identifier: MIT
#include <gtest/gtest.h>

#include "support/AllocationCounter.hpp"
#include "support/ElementOrder.hpp"
#include "vclink/FileStateMap.hpp"

TEST(StandInPathOrder, AllocatesNothing)
{
    const auto texts = vclink_host_tests::makeRandomPaths(3, 300);
    const std::vector<upath> paths(texts.begin(), texts.end());
    const auto less = vclink::FileStateMap().key_comp();
    const vclink::test::AllocationCounter counter;
    std::size_t ordered = 0;
    for (const upath &left : paths)
    {
        for (const upath &right : paths)
            ordered += less(left, right) ? 1 : 0;
    }
    EXPECT_EQ(counter.count(), 0U);
    EXPECT_GT(ordered, 0U);
    EXPECT_TRUE(noexcept(less(paths[0], paths[1])));
}

TEST(StandInPathOrder, TreatsPathsOfTheSameElementsAsEquivalent)
{
    const auto less = vclink::FileStateMap().key_comp();
    for (const char16_t *other : {u"/a/b/", u"//a/b", u"/a//b", u"///a///b///"})
    {
        EXPECT_FALSE(less(upath(u"/a/b"), upath(other)));
        EXPECT_FALSE(less(upath(other), upath(u"/a/b")));
    }
}

TEST(StandInPathOrder, TakesTheRootAsAnElementLikeOthers)
{
    const auto less = vclink::FileStateMap().key_comp();
    EXPECT_TRUE(less(upath(u"-"), upath(u"/")));
    EXPECT_TRUE(less(upath(u"/z"), upath(u"0")));
    EXPECT_FALSE(less(upath(u"0"), upath(u"/z")));
}
