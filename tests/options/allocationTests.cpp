// SPDX-License-Identifier: MIT
// What is allocated, and what is not.
#include <memory>

#include <gtest/gtest.h>

#include "options/Callbacks.hpp"
#include "options/GitCallbacks.hpp"
#include "support/AllocationCounter.hpp"
#include "support/LogCapture.hpp"
#include "support/TestInteractor.hpp"
#include "vclink/git/GitOptionsFactory.hpp"

namespace vclink::git
{
namespace
{

using test::AllocationCounter;
using test::TestInteractor;

struct Target
{
    int answer(int number)
    {
        return number;
    }
};

TEST(Allocations, AreNoneForACallbackThatNobodyLogs)
{
    logger().set_enabled_severities(0);
    const test::LogCapture log(0);
    const auto answer = makeCallback<&Target::answer, int (*)(int, void *)>();
    Target target;
    const AllocationCounter counter;
    EXPECT_EQ(answer(5, &target), 5);
    EXPECT_EQ(counter.count(), 0u);
}

TEST(Allocations, OfAnOptionsFactoryAreTheBaseAlone)
{
    const auto interactor = std::make_shared<TestInteractor>();
    const AllocationCounter counter;
    const auto composing = GitOptionsFactory::makeDefault(interactor);
    EXPECT_EQ(counter.count(), 1u);
    EXPECT_EQ(counter.bytes(), sizeof(GitOptionsFactory));
    const auto plain = GitOptionsFactory::makeUninitialized(interactor);
    EXPECT_EQ(counter.count(), 2u);
    EXPECT_EQ(counter.bytes(), 2 * sizeof(GitOptionsFactory));
}

} // namespace
} // namespace vclink::git
