// SPDX-License-Identifier: MIT
#include <functional>
#include <memory>
#include <stdexcept>
#include <type_traits>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "util/scope/ScopedCleanup.hpp"

namespace
{

using testing::ElementsAre;
using vclink::git::ScopedCleanup;

TEST(ScopedCleanup, RunsItsFunctionOnceAtItsEnd)
{
    int runs = 0;
    {
        const ScopedCleanup cleanup([&runs] { ++runs; });
        EXPECT_EQ(runs, 0);
    }
    EXPECT_EQ(runs, 1);
}

TEST(ScopedCleanup, RunsItsFunctionWhenAnExceptionPasses)
{
    int runs = 0;
    const auto raise = [&runs]
    {
        const ScopedCleanup cleanup([&runs] { ++runs; });
        throw std::runtime_error("passing");
    };
    EXPECT_THROW(raise(), std::runtime_error);
    EXPECT_EQ(runs, 1);
}

TEST(ScopedCleanup, SwallowsWhatItsFunctionRaises)
{
    EXPECT_NO_THROW(static_cast<void>(ScopedCleanup([] { throw std::runtime_error("cleanup"); })));
    EXPECT_NO_THROW(static_cast<void>(ScopedCleanup([] { throw 7; })));
}

TEST(ScopedCleanup, KeepsThePassingExceptionWhenItsFunctionRaises)
{
    const auto raise = []
    {
        const ScopedCleanup cleanup([] { throw 7; });
        throw std::runtime_error("passing");
    };
    EXPECT_THROW(raise(), std::runtime_error);
}

TEST(ScopedCleanup, DoesNothingWithoutAFunction)
{
    EXPECT_NO_THROW(static_cast<void>(ScopedCleanup()));
    EXPECT_NO_THROW(static_cast<void>(ScopedCleanup(std::function<void()>())));
    EXPECT_NO_THROW(static_cast<void>(ScopedCleanup(nullptr)));
}

TEST(ScopedCleanup, DestroysItsFunctionAfterTheRun)
{
    const auto token = std::make_shared<int>(0);
    long duringRun = 0;
    {
        const ScopedCleanup cleanup([token, &duringRun] { duringRun = token.use_count(); });
        EXPECT_EQ(token.use_count(), 2);
    }
    EXPECT_EQ(duringRun, 2);
    EXPECT_EQ(token.use_count(), 1);
}

TEST(ScopedCleanup, DestroysAFunctionThatRaises)
{
    const auto token = std::make_shared<int>(0);
    {
        const ScopedCleanup cleanup([token] { throw std::runtime_error("cleanup"); });
    }
    EXPECT_EQ(token.use_count(), 1);
}

TEST(ScopedCleanup, RunsInTheReverseOrderOfConstruction)
{
    std::vector<int> order;
    {
        const ScopedCleanup first([&order] { order.push_back(1); });
        const ScopedCleanup second([&order] { order.push_back(2); });
        const ScopedCleanup third([&order] { order.push_back(3); });
    }
    EXPECT_THAT(order, ElementsAre(3, 2, 1));
}

TEST(ScopedCleanup, IsNeitherCopiedNorMoved)
{
    EXPECT_FALSE(std::is_copy_constructible_v<ScopedCleanup>);
    EXPECT_FALSE(std::is_move_constructible_v<ScopedCleanup>);
    EXPECT_FALSE(std::is_copy_assignable_v<ScopedCleanup>);
    EXPECT_FALSE(std::is_move_assignable_v<ScopedCleanup>);
}

} // namespace
