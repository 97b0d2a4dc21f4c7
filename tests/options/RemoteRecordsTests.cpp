// SPDX-License-Identifier: MIT
#include <functional>
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
#include "error/logging/severity.hpp"
#include "options/bytesOf.hpp"
#include "options/gitRecords.hpp"
#include "support/LogCapture.hpp"
#include "support/TestInteractor.hpp"
#include "support/libgit2/LibGit2Recorder.hpp"
#include "vclink/git/GitOptionsFactory.hpp"
#include "vclink/util/exception/CancelledOperationException.hpp"

namespace vclink::git
{
namespace
{

using test::bytesOf;
using test::initialised;
using test::LogCapture;
using testing::ElementsAre;
using testing::StartsWith;
using vclink::util::exception::CancelledOperationException;

MATCHER(NamesMember, "")
{
    return std::get<0>(arg).find(std::string("RemoteCallbacks::") + std::get<1>(arg)) !=
           std::string::npos;
}

class RemoteRecords : public testing::Test
{
  protected:
    RemoteRecords()
    {
        checkRecords<git_remote_init_callbacks>();
        checkRecords<git_proxy_options_init>();
        checkRecords<git_checkout_options_init>();
        checkRecords<git_fetch_options_init>();
        checkRecords<git_push_options_init>();
        checkRecords<git_clone_options_init>();
    }

    git_remote_callbacks remoteRecord()
    {
        return toGitRemoteCallbacks(callbacks_->remoteCallbacks());
    }
    git_proxy_options proxyRecord()
    {
        return toGitProxyOptions(ProxyOptions(), callbacks_->proxyCallbacks());
    }
    /// Calls all ten functions of the record.
    static void callAll(const git_remote_callbacks &record)
    {
        // They are called by libgit2 alone.
        const test::HermeticLibGit2 libgit2;
        void *const set = record.payload;
        const git_indexer_progress stats = {};
        git_credential *credential = nullptr;
        EXPECT_EQ(record.sideband_progress("hello", 5, set), 0);
        EXPECT_EQ(record.completion(GIT_REMOTE_COMPLETION_INDEXING, set), 0);
        EXPECT_EQ(record.credentials(&credential, "url", "user", 1, set), -1);
        EXPECT_EQ(record.certificate_check(nullptr, 1, "host", set), 1);
        EXPECT_EQ(record.transfer_progress(&stats, set), 0);
        EXPECT_EQ(record.update_tips("tip", nullptr, nullptr, set), 0);
        EXPECT_EQ(record.pack_progress(1, 2, 3, set), 0);
        EXPECT_EQ(record.push_transfer_progress(4, 5, 6, set), 0);
        EXPECT_EQ(record.push_update_reference("name", "no", set), 0);
        EXPECT_EQ(record.push_negotiation(nullptr, 7, set), 0);
    }
    const test::EmptySlot emptySlot_;
    test::LibGit2Recorder calls_;

    const std::shared_ptr<test::TestInteractor> interactor_ =
        std::make_shared<test::TestInteractor>();
    const std::unique_ptr<GitCallbacks> callbacks_ = makeDefaultGitCallbacks(interactor_);

  private:
    /// Expects that libgit2 is given zeroed records, of version 1.
    template <auto Init> void checkRecords()
    {
        calls_.on<Init>(
            [](const auto *record, unsigned version)
            {
                EXPECT_THAT(bytesOf(*record), testing::Each(0));
                EXPECT_EQ(version, 1U);
            });
    }
};

using ToGitRemoteCallbacks = RemoteRecords;
using ToGitFetchOptions = RemoteRecords;
using ToGitPushOptions = RemoteRecords;
using ToGitCloneOptions = RemoteRecords;

TEST_F(ToGitRemoteCallbacks, SetsTheseFieldsAndLeavesTheOthersAsLibGit2MadeThem)
{
    git_remote_callbacks expected = initialised(git_remote_init_callbacks);
    const git_remote_callbacks record = remoteRecord();
    expected.sideband_progress = record.sideband_progress;
    expected.completion = record.completion;
    expected.credentials = record.credentials;
    expected.certificate_check = record.certificate_check;
    expected.transfer_progress = record.transfer_progress;
    expected.update_tips = record.update_tips;
    expected.pack_progress = record.pack_progress;
    expected.push_transfer_progress = record.push_transfer_progress;
    expected.push_update_reference = record.push_update_reference;
    expected.push_negotiation = record.push_negotiation;
    expected.payload = &callbacks_->remoteCallbacks();
    EXPECT_EQ(bytesOf(record), bytesOf(expected));
    EXPECT_EQ(record.version, 1u);
    EXPECT_EQ(record.transport, nullptr);
    EXPECT_EQ(record.resolve_url, nullptr);
}

TEST_F(ToGitRemoteCallbacks, WiresEachOfTheTenToItsMember)
{
    const git_remote_callbacks record = remoteRecord();
    const LogCapture log(SeverityProgress | SeverityParameter);
    callAll(record);
    EXPECT_THAT(log.messages(),
                ElementsAre(" msgStr=hello", " type=1",
                            " url=url username_from_url=user allowed_types=1", " valid=1 host=host",
                            "Transfer Progress (Objects / Bytes): 00", " ref=tip",
                            " stage=1 current=2 total=3", " current=4 total=5 bytes=6",
                            " refnameStr=name statusStr=no", " len=7"));
}

TEST_F(ToGitRemoteCallbacks, TracesEachOfTheTenUnderItsOwnName)
{
    const git_remote_callbacks record = remoteRecord();
    const LogCapture log(SeverityScopeEntry);
    callAll(record);
#ifdef __clang__
    // It names the callback's arguments only.
    EXPECT_EQ(log.messages().size(), 10u);
#else
    const char *const members[] = {
        "sidebandProgress",    "completion",     "credentials",  "certificateCheck",
        "transferProgress",    "updateTips",     "packProgress", "pushTransferProgress",
        "pushUpdateReference", "pushNegotiation"};
    EXPECT_THAT(log.messages(), testing::Pointwise(NamesMember(), members));
#endif
}

TEST_F(ToGitRemoteCallbacks, ParksACancellationOfEitherPollPoint)
{
    const git_remote_callbacks record = remoteRecord();
    const git_indexer_progress stats = {};
    for (const auto &poll :
         std::vector<std::function<int()>>{
             [&] { return record.sideband_progress("", 0, record.payload); },
             [&] { return record.transfer_progress(&stats, record.payload); }})
    {
        interactor_->cancel();
        const LogCapture log(SeverityException);
        EXPECT_EQ(poll(), GIT_EUSER);
        EXPECT_THAT(log.messages(), ElementsAre(StartsWith("Exception caught: ")));
        ASSERT_NE(pendingCallbackException(), nullptr);
        EXPECT_THROW(std::rethrow_exception(pendingCallbackException()),
                     CancelledOperationException);
        pendingCallbackException() = nullptr;
        EXPECT_EQ(poll(), 0) << "the request is still there";
    }
}

TEST_F(ToGitRemoteCallbacks, ParksWhatTheLogRaises)
{
    const git_remote_callbacks record = remoteRecord();
    const LogCapture log(SeverityParameter);
    const test::CoreFilter filter([](unsigned) -> bool { throw std::runtime_error("no disk"); });
    EXPECT_EQ(record.completion(GIT_REMOTE_COMPLETION_DOWNLOAD, record.payload), GIT_EUSER);
    EXPECT_EQ(record.certificate_check(nullptr, 1, "host", record.payload), GIT_EUSER);
    ASSERT_NE(pendingCallbackException(), nullptr);
    EXPECT_THROW(std::rethrow_exception(pendingCallbackException()), std::runtime_error);
}

TEST_F(ToGitFetchOptions, SetsTheProxyAndThenTheCallbacksAndLeavesTheRestToTheConfiguration)
{
    git_fetch_options expected = initialised(git_fetch_options_init);
    expected.proxy_opts = proxyRecord();
    expected.callbacks = remoteRecord();
    calls_.clear();
    EXPECT_EQ(bytesOf(toGitFetchOptions(FetchOptions(), *callbacks_)), bytesOf(expected));
    EXPECT_THAT(calls_.steps(), ElementsAre("git_fetch_options_init", "git_proxy_options_init",
                                            "git_remote_init_callbacks"));
}

TEST_F(ToGitPushOptions, SetsTheThreadsThenTheCallbacksAndTheProxy)
{
    git_push_options expected = initialised(git_push_options_init);
    expected.callbacks = remoteRecord();
    expected.proxy_opts = proxyRecord();
    calls_.clear();
    PushOptions options;
    for (const unsigned threads : {1u, 0u, 3u, 0xFFFFFFFFu})
    {
        options.packbuilderParallelism = threads;
        expected.pb_parallelism = threads;
        calls_.clear();
        EXPECT_EQ(bytesOf(toGitPushOptions(options, *callbacks_)), bytesOf(expected));
        EXPECT_THAT(calls_.steps(),
                    ElementsAre("git_push_options_init", "git_remote_init_callbacks",
                                "git_proxy_options_init"));
    }
    EXPECT_EQ(toGitPushOptions(PushOptions(), *callbacks_).pb_parallelism, 1u);
}

TEST_F(ToGitCloneOptions, SetsTheRecordsOfTheCheckoutAndOfTheFetch)
{
    git_clone_options expected = initialised(git_clone_options_init);
    CloneOptions options;
    options.checkoutOptions.checkoutStrategy = 0x12;
    expected.checkout_opts =
        toGitCheckoutOptions(options.checkoutOptions, callbacks_->checkoutCallbacks());
    expected.fetch_opts = toGitFetchOptions(options.fetchOptions, *callbacks_);
    calls_.clear();
    EXPECT_EQ(bytesOf(toGitCloneOptions(options, *callbacks_)), bytesOf(expected));
    EXPECT_THAT(calls_.steps(), ElementsAre("git_clone_options_init", "git_checkout_options_init",
                                            "git_fetch_options_init", "git_proxy_options_init",
                                            "git_remote_init_callbacks"));
}

TEST_F(ToGitCloneOptions, OfTheFactoryAreASafeCloneWithAWorkingTree)
{
    const auto factory = GitOptionsFactory::makeDefault(interactor_);
    const git_clone_options record = toGitCloneOptions(factory->makeCloneOptions(), *callbacks_);
    const git_clone_options expected = initialised(git_clone_options_init);
    EXPECT_EQ(record.bare, 0);
    EXPECT_EQ(record.checkout_branch, nullptr);
    EXPECT_EQ(record.local, expected.local);
    EXPECT_EQ(record.checkout_opts.checkout_strategy, unsigned{GIT_CHECKOUT_SAFE});
}

TEST_F(ToGitCloneOptions, TakesWhetherToBeBareAndPointsAtTheBranchOfItsOptions)
{
    CloneOptions options;
    EXPECT_EQ(toGitCloneOptions(options, *callbacks_).checkout_branch, nullptr);
    options.bare = true;
    options.checkoutBranch = "main";
    const git_clone_options record = toGitCloneOptions(options, *callbacks_);
    EXPECT_EQ(record.bare, 1);
    EXPECT_EQ(record.checkout_branch, options.checkoutBranch->c_str());
    // It is the caller's who keeps the options for as long as the record.
    options.checkoutBranch->front() = 'p';
    EXPECT_STREQ(record.checkout_branch, "pain");
}

} // namespace
} // namespace vclink::git
