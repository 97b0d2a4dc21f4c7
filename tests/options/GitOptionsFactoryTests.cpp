// SPDX-License-Identifier: MIT
#include "vclink/git/GitOptionsFactory.hpp"

#include <memory>
#include <type_traits>
#include <typeinfo>
#include <utility>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "error/VirtualTable.hpp"
#include "support/TestInteractor.hpp"
#include "support/libgit2Release.hpp"

namespace vclink::git
{
namespace
{

using test::slotOf;
using test::TestInteractor;
using test::virtualTableOf;

static_assert(std::is_abstract_v<GitOptionsFactory> &&
              std::has_virtual_destructor_v<GitOptionsFactory>);
static_assert(sizeof(GitOptionsFactory) == sizeof(void *) + sizeof(std::shared_ptr<int>));
static_assert(!std::is_default_constructible_v<GitOptionsFactory>);

template <auto Operation, class Value>
constexpr bool gives = std::is_same_v<decltype(Operation), Value (GitOptionsFactory::*)()>;
static_assert(gives<&GitOptionsFactory::makeCloneOptions, CloneOptions> &&
              gives<&GitOptionsFactory::makeFetchOptions, FetchOptions> &&
              gives<&GitOptionsFactory::makeProxyOptions, ProxyOptions> &&
              gives<&GitOptionsFactory::makePushOptions, PushOptions> &&
              gives<&GitOptionsFactory::makeCheckoutOptions, CheckoutOptions> &&
              gives<&GitOptionsFactory::makeStatusOptions, StatusOptions> &&
              gives<&GitOptionsFactory::makeMergeOptions, MergeOptions>);

using Make = std::unique_ptr<GitOptionsFactory> (*)(std::shared_ptr<ApplicationInteractor>);
constexpr Make makers[] = {&GitOptionsFactory::makeDefault, &GitOptionsFactory::makeUninitialized};

TEST(GitOptionsFactory, HasItsSlotsInOrder)
{
    EXPECT_EQ(slotOf(&GitOptionsFactory::makeCloneOptions), 2u);
    EXPECT_EQ(slotOf(&GitOptionsFactory::makeFetchOptions), 3u);
    EXPECT_EQ(slotOf(&GitOptionsFactory::makeProxyOptions), 4u);
    EXPECT_EQ(slotOf(&GitOptionsFactory::makePushOptions), 5u);
    EXPECT_EQ(slotOf(&GitOptionsFactory::makeCheckoutOptions), 6u);
    EXPECT_EQ(slotOf(&GitOptionsFactory::makeStatusOptions), 7u);
    EXPECT_EQ(slotOf(&GitOptionsFactory::makeMergeOptions), 8u);
}

TEST(GitOptionsFactory, TakesTheShareOfTheInteractorThatItIsGiven)
{
    for (const Make make : makers)
    {
        auto interactor = std::make_shared<TestInteractor>();
        const std::weak_ptr<ApplicationInteractor> watch = interactor;
        auto factory = make(interactor);
        EXPECT_EQ(watch.use_count(), 2);
        EXPECT_EQ(factory->getInteractor(), interactor);
        factory = make(std::move(interactor));
        EXPECT_EQ(watch.use_count(), 1);
        factory.reset();
        EXPECT_TRUE(watch.expired());
    }
}

TEST(GitOptionsFactory, GivesTheSameValuesInBothClasses)
{
    for (const Make make : makers)
    {
        const auto factory = make(std::make_shared<TestInteractor>());
        const CloneOptions clone = factory->makeCloneOptions();
        EXPECT_FALSE(clone.bare);
        EXPECT_FALSE(clone.checkoutBranch.has_value());
        EXPECT_EQ(clone.checkoutOptions.checkoutStrategy, test::libgit2_release::safeCheckout);
        EXPECT_EQ(factory->makePushOptions().packbuilderParallelism, 1u);
        EXPECT_EQ(factory->makeCheckoutOptions().checkoutStrategy,
                  test::libgit2_release::safeCheckout);
        // These have no fields that could differ.
        EXPECT_NO_THROW(factory->makeFetchOptions());
        EXPECT_NO_THROW(factory->makeProxyOptions());
        EXPECT_NO_THROW(factory->makeStatusOptions());
        EXPECT_NO_THROW(factory->makeMergeOptions());
    }
}

TEST(GitOptionsFactory, HasTwoClassesThatDifferInTheThreeSlotsWithNestedValues)
{
    const auto interactor = std::make_shared<TestInteractor>();
    const auto composing = GitOptionsFactory::makeDefault(interactor);
    const auto plain = GitOptionsFactory::makeUninitialized(interactor);
    const GitOptionsFactory &one = *composing;
    const GitOptionsFactory &two = *plain;
    EXPECT_NE(typeid(one), typeid(two));
    const auto tableOne = virtualTableOf(one, 9);
    const auto tableTwo = virtualTableOf(two, 9);
    for (const std::size_t slot : {2u, 3u, 5u})
        EXPECT_NE(tableOne[slot], tableTwo[slot]) << slot;
    for (const std::size_t slot : {4u, 6u, 7u, 8u})
        EXPECT_EQ(tableOne[slot], tableTwo[slot]) << slot;
}

} // namespace
} // namespace vclink::git
