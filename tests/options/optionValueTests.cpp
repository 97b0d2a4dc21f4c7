// SPDX-License-Identifier: MIT
#include <cstddef>
#include <cstdint>
#include <string>
#include <type_traits>

#include <boost/optional/optional.hpp>
#include <git2/checkout.h>
#include <gtest/gtest.h>

#include "error/VirtualTable.hpp"
#include "support/libgit2Release.hpp"
#include "vclink/git/CheckoutOptions.hpp"
#include "vclink/git/CloneOptions.hpp"
#include "vclink/git/FetchOptions.hpp"
#include "vclink/git/MergeOptions.hpp"
#include "vclink/git/ProxyOptions.hpp"
#include "vclink/git/PushOptions.hpp"
#include "vclink/git/StatusOptions.hpp"

namespace vclink::git
{
namespace
{

using test::offsetIn;

template <class... Values>
constexpr bool arePlainValues = ((std::is_default_constructible_v<Values> &&
                                  std::is_copy_constructible_v<Values> &&
                                  std::is_copy_assignable_v<Values> &&
                                  !std::is_polymorphic_v<Values>)&&...);
static_assert(arePlainValues<CheckoutOptions, ProxyOptions, FetchOptions, PushOptions, MergeOptions,
                             StatusOptions, CloneOptions>);
static_assert(std::is_empty_v<ProxyOptions> && std::is_empty_v<MergeOptions>);
static_assert(!std::is_same_v<ProxyOptions, MergeOptions>);

static_assert(std::is_same_v<decltype(CheckoutOptions::checkoutStrategy), std::uint64_t>);
static_assert(std::is_same_v<decltype(FetchOptions::proxyOptions), ProxyOptions>);
static_assert(std::is_same_v<decltype(PushOptions::packbuilderParallelism), std::uint32_t>);
static_assert(std::is_same_v<decltype(PushOptions::proxyOptions), ProxyOptions>);
static_assert(std::is_same_v<decltype(CloneOptions::bare), bool>);
static_assert(std::is_same_v<decltype(CloneOptions::checkoutBranch), boost::optional<std::string>>);
static_assert(std::is_same_v<decltype(CloneOptions::checkoutOptions), CheckoutOptions>);
static_assert(std::is_same_v<decltype(CloneOptions::fetchOptions), FetchOptions>);

TEST(CheckoutOptions, BeginSafe)
{
    EXPECT_EQ(CheckoutOptions().checkoutStrategy, test::libgit2_release::safeCheckout);
    EXPECT_EQ(CheckoutOptions().checkoutStrategy, std::uint64_t{GIT_CHECKOUT_SAFE});
}

TEST(PushOptions, BeginWithOneThread)
{
    const PushOptions options;
    EXPECT_EQ(options.packbuilderParallelism, 1u);
    EXPECT_LT(offsetIn(options, options.packbuilderParallelism),
              offsetIn(options, options.proxyOptions));
}

TEST(CloneOptions, BeginWithTheDefaultBranchAndAWorkingTree)
{
    const CloneOptions options;
    EXPECT_FALSE(options.bare);
    EXPECT_FALSE(options.checkoutBranch.has_value());
    EXPECT_EQ(options.checkoutOptions.checkoutStrategy, CheckoutOptions().checkoutStrategy);
}

TEST(CloneOptions, HaveTheirFieldsInOrder)
{
    const CloneOptions options;
    EXPECT_EQ(offsetIn(options, options.bare), 0);
    EXPECT_LT(offsetIn(options, options.bare), offsetIn(options, options.checkoutBranch));
    EXPECT_LT(offsetIn(options, options.checkoutBranch),
              offsetIn(options, options.checkoutOptions));
    EXPECT_LT(offsetIn(options, options.checkoutOptions), offsetIn(options, options.fetchOptions));
}

TEST(CloneOptions, AreCopiedWithTheirBranch)
{
    CloneOptions options;
    options.checkoutBranch = std::string("topic");
    const CloneOptions copy = options;
    options.checkoutBranch->assign("other");
    EXPECT_EQ(*copy.checkoutBranch, "topic");
}

} // namespace
} // namespace vclink::git
