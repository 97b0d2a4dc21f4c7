// SPDX-License-Identifier: MIT
#include <cstdint>
#include <memory>
#include <stdexcept>
#include <string>
#include <vector>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "error/CoreFilter.hpp"
#include "error/EmptySlot.hpp"
#include "error/HermeticLibGit2.hpp"
#include "error/errorUtil/callbackException.hpp"
#include "error/errorUtil/libgit2Errors.hpp"
#include "error/logging/severity.hpp"
#include "options/bytesOf.hpp"
#include "options/gitRecords.hpp"
#include "support/Failure.hpp"
#include "support/LogCapture.hpp"
#include "support/TestInteractor.hpp"
#include "vclink/git/LibGit2Exception.hpp"
#include "vclink/util/exception/CancelledOperationException.hpp"

namespace vclink::git
{
namespace
{

using test::bytesOf;
using test::CoreFilter;
using test::Failure;
using test::failureOf;
using test::HermeticLibGit2;
using test::initialised;
using test::LogCapture;
using test::TestInteractor;
using testing::Each;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::StartsWith;
using vclink::util::exception::CancelledOperationException;

std::vector<unsigned char> bytesBeforeInit;
unsigned versionGiven = 0;

/// Stands for libgit2's init function: notes what it is given and sets one field.
int noteAndInit(git_merge_options *record, unsigned version)
{
    bytesBeforeInit = bytesOf(*record);
    versionGiven = version;
    record->target_limit = 77;
    return 0;
}

int failToInit(git_merge_options *record, unsigned /*version*/)
{
    record->target_limit = 77;
    git_error_set_str(GIT_ERROR_INVALID, "invalid version 9");
    return -1;
}

TEST(InitGitRecord, GivesAZeroedRecordToLibGit2)
{
    const git_merge_options record = initGitRecord(&noteAndInit, 3u);
    EXPECT_EQ(bytesBeforeInit.size(), sizeof(record));
    EXPECT_THAT(bytesBeforeInit, Each(0));
    EXPECT_EQ(versionGiven, 3u);
    EXPECT_EQ(record.target_limit, 77u);
}

TEST(InitGitRecord, RaisesTheFailureOfLibGit2)
{
    const HermeticLibGit2 libgit2;
    EXPECT_EQ(failureOf([&] { static_cast<void>(initGitRecord(&failToInit, 9u)); }),
              (Failure{-1, GIT_ERROR_INVALID, "invalid version 9"}));
    EXPECT_THROW(initGitRecord(git_proxy_options_init, 999u), LibGit2Exception);
}

TEST(ToGitProxyOptions, GivesTheRecordThatLibGit2Makes)
{
    const auto expected = initialised(git_proxy_options_init);
    const auto callbacks = makeDefaultGitCallbacks(std::make_shared<TestInteractor>());
    const auto record = toGitProxyOptions(ProxyOptions(), callbacks->proxyCallbacks());
    EXPECT_EQ(bytesOf(record), bytesOf(expected));
    EXPECT_EQ(record.version, 1u);
    EXPECT_EQ(record.type, GIT_PROXY_NONE);
    EXPECT_EQ(record.url, nullptr);
    EXPECT_EQ(record.payload, nullptr);
}

TEST(ToGitMergeOptions, GivesTheRecordThatLibGit2Makes)
{
    const auto expected = initialised(git_merge_options_init);
    const git_merge_options record = toGitMergeOptions(MergeOptions());
    EXPECT_EQ(bytesOf(record), bytesOf(expected));
    EXPECT_EQ(record.version, 1u);
}

class ToGitCheckoutOptions : public testing::Test
{
  protected:
    const test::EmptySlot emptySlot;

    git_checkout_options convert(std::uint64_t strategy)
    {
        CheckoutOptions options;
        options.checkoutStrategy = strategy;
        return toGitCheckoutOptions(options, checkoutCallbacks());
    }
    CheckoutCallbacks &checkoutCallbacks()
    {
        return callbacks_->checkoutCallbacks();
    }
    static int notify(const git_checkout_options &record)
    {
        return record.notify_cb(GIT_CHECKOUT_NOTIFY_DIRTY, "file", nullptr, nullptr, nullptr,
                                record.notify_payload);
    }

    const std::shared_ptr<TestInteractor> interactor_ = std::make_shared<TestInteractor>();
    const std::unique_ptr<GitCallbacks> callbacks_ = makeDefaultGitCallbacks(interactor_);
};

TEST_F(ToGitCheckoutOptions, SetsTheseFieldsAndLeavesTheOthersAsLibGit2MadeThem)
{
    git_checkout_options expected = initialised(git_checkout_options_init);
    const git_checkout_options record = convert(6);
    ASSERT_TRUE(record.notify_cb && record.progress_cb && record.perfdata_cb);
    expected.checkout_strategy = 6;
    expected.notify_flags = 0xFFFF;
    expected.notify_cb = record.notify_cb;
    expected.progress_cb = record.progress_cb;
    expected.perfdata_cb = record.perfdata_cb;
    expected.notify_payload = &checkoutCallbacks();
    expected.progress_payload = &checkoutCallbacks();
    expected.perfdata_payload = &checkoutCallbacks();
    EXPECT_EQ(bytesOf(record), bytesOf(expected));
    EXPECT_EQ(record.version, 1u);
    EXPECT_EQ(record.notify_flags, GIT_CHECKOUT_NOTIFY_ALL);
}

TEST_F(ToGitCheckoutOptions, TakesTheLowBitsOfTheStrategyAndIsSafeByDefault)
{
    EXPECT_EQ(convert(1).checkout_strategy, 1u);
    EXPECT_EQ(convert(0x12).checkout_strategy, 0x12u);
    EXPECT_EQ(convert(0xFFFF'FFFFu).checkout_strategy, 0xFFFF'FFFFu);
    EXPECT_EQ(convert(0x1'0000'0000u).checkout_strategy, 0u);
    EXPECT_EQ(convert(0xFEDC'BA98'0000'0006u).checkout_strategy, 6u);
    EXPECT_EQ(toGitCheckoutOptions(CheckoutOptions(), checkoutCallbacks()).checkout_strategy,
              unsigned{GIT_CHECKOUT_SAFE});
}

TEST_F(ToGitCheckoutOptions, WiresEachCallbackToItsMemberAndTracesItUnderTheMembersName)
{
    const git_checkout_options record = convert(1);
    const git_checkout_perfdata data = {};
    const LogCapture log(SeverityProgress | SeverityParameter | SeverityScopeEntry);
    EXPECT_EQ(notify(record), 0);
    record.progress_cb(nullptr, 7, 9, record.progress_payload);
    record.perfdata_cb(&data, record.perfdata_payload);
    EXPECT_THAT(log.messages(SeverityProgress | SeverityParameter),
                ElementsAre("Checkout Notify : 2 (file)",
                            " pathStr= completed_steps=7 total_steps=9",
                            "Calls to chmod / mkdir / stat : 0 / 0 / 0"));
#ifdef __clang__
    // It names the callback's arguments only.
    EXPECT_THAT(log.messages(SeverityScopeEntry),
                ElementsAre(HasSubstr("git_checkout_notify_t"),
                            HasSubstr("const char *, unsigned long"),
                            HasSubstr("git_checkout_perfdata")));
#else
    EXPECT_THAT(log.messages(SeverityScopeEntry),
                ElementsAre(HasSubstr("CheckoutCallbacks::notifyProgress"),
                            HasSubstr("CheckoutCallbacks::checkoutProgress"),
                            HasSubstr("CheckoutCallbacks::perfData")));
#endif
}

TEST_F(ToGitCheckoutOptions, ParksACancellationForTheCaller)
{
    const git_checkout_options record = convert(1);
    interactor_->cancel();
    const LogCapture log(SeverityException);
    EXPECT_EQ(notify(record), GIT_EUSER);
    EXPECT_THAT(log.messages(), ElementsAre(StartsWith("Exception caught: ")));
    ASSERT_NE(pendingCallbackException(), nullptr);
    EXPECT_THROW(std::rethrow_exception(pendingCallbackException()), CancelledOperationException);
    EXPECT_EQ(notify(record), 0) << "the request is still there";
}

TEST_F(ToGitCheckoutOptions, LosesWhatTheDisplayRaises)
{
    const git_checkout_options record = convert(1);
    interactor_->progress.onCall = [](std::size_t number)
    {
        if (number == 1)
            throw std::runtime_error("no display");
        throw 42;
    };
    const LogCapture log(SeverityException);
    record.progress_cb("file", 1, 2, record.progress_payload);
    record.progress_cb("file", 2, 2, record.progress_payload);
    EXPECT_EQ(interactor_->progress.calls.size(), 2u);
    EXPECT_THAT(log.messages(),
                ElementsAre(HasSubstr("no display"), StartsWith("Exception caught: ")));
    EXPECT_EQ(pendingCallbackException(), nullptr);
}

TEST_F(ToGitCheckoutOptions, LosesWhatTheLogRaisesAboutPerformance)
{
    const git_checkout_options record = convert(1);
    const git_checkout_perfdata data = {};
    const LogCapture log(SeverityProgress | SeverityException);
    const CoreFilter filter(
        [](unsigned severity)
        {
            if (severity == SeverityProgress)
                throw std::runtime_error("no disk");
            return true;
        });
    record.perfdata_cb(&data, record.perfdata_payload);
    EXPECT_THAT(log.messages(), ElementsAre(HasSubstr("no disk")));
    EXPECT_EQ(pendingCallbackException(), nullptr);
}

} // namespace
} // namespace vclink::git
