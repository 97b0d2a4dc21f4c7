// SPDX-License-Identifier: MIT
// A fetch that is stopped, and what the other poller of the adapter still holds then.

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "RemoteFixture.hpp"
#include "error/logging/severity.hpp"
#include "support/LogCapture.hpp"
#include "support/cancelAt.hpp"

namespace
{

namespace git = vclink::git;
using testing::Contains;
using testing::Not;
using testing::StartsWith;
using namespace vclink::test;

using RemoteCancellation = RemoteFixture;

TEST_F(RemoteCancellation, AskedForBeforeStopsAFetchAtItsFirstPollPointAndIsForgotten)
{
    interactor_->cancel();
    const auto before = stateOf(repository_);
    {
        const LogCapture log(git::SeverityParameter | git::SeverityProgress |
                             git::SeverityDiagnostic | git::SeverityException);
        expectCancelled([this] { fetch(); });
        EXPECT_THAT(log.messages(), testing::ElementsAre(StartsWith("Exception caught: "),
                                                         "Re-throwing error from callback"));
    }
    EXPECT_EQ(stateOf(repository_), before);
    EXPECT_NO_THROW(fetch());
    EXPECT_EQ(idOf("origin/main"), idOf("main", author_));
}

TEST_F(RemoteCancellation, DuringTheTransferOrWhileTheServerTalksStopsAFetch)
{
    const auto before = stateOf(repository_);
    for (const auto *record : {"Transfer Progress", " msgStr="})
    {
        LogCapture log(git::SeverityProgress | git::SeverityParameter);
        cancelAt(log, *interactor_, record);
        expectCancelled([this] { fetch(); });
        EXPECT_EQ(stateOf(repository_), before);
    }
    EXPECT_NO_THROW(fetch());
    EXPECT_EQ(idOf("origin/main"), idOf("main", author_));
    EXPECT_TRUE(repository_.tryGit({"fsck", "--full", "--strict"}).succeeded());
}

TEST_F(RemoteCancellation, OfAFetchStillStopsTheNextCheckoutAndTheOtherWayRound)
{
    fetch();
    repository_.git({"reset", "--quiet", "--hard", "origin/main"});
    repository_.git({"checkout", "--quiet", "-b", "topic"});
    commit("file", "of the topic\n");
    publish("file", "changed\n");
    LogCapture log(git::SeverityProgress);
    cancelAt(log, *interactor_, "Transfer Progress");
    expectCancelled([this] { fetch(); });
    log.clear();
    expectCancelled([this] { branches().switchBranch("main"); });
    EXPECT_THAT(log.messages(), Not(Contains(StartsWith("Checkout Notify"))));
    EXPECT_EQ(currentBranch(), "refs/heads/topic");
    log.onRecord(nullptr);
    interactor_->cancel();
    expectCancelled([this] { branches().switchBranch("main"); });
    expectCancelled([this] { fetch(); });
    EXPECT_NO_THROW(branches().switchBranch("main"));
    EXPECT_NO_THROW(fetch());
}

TEST_F(RemoteCancellation, StaysForTheNextFetchWhereAListingDoesNotPoll)
{
    interactor_->cancel();
    EXPECT_EQ(remote().getRemoteHeads().size(), 2U);
    expectCancelled([this] { fetch(); });
}

} // namespace
