// SPDX-License-Identifier: MIT
#include <atomic>
#include <chrono>
#include <filesystem>
#include <string>
#include <thread>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "DaemonFixture.hpp"
#include "ScriptedServer.hpp"
#include "error/logging/severity.hpp"
#include "relay.hpp"
#include "support/LogCapture.hpp"
#include "vclink/git/BranchManager.hpp"

namespace
{

namespace git = vclink::git;
using namespace vclink::test;

/// Whether a record is one of a kind.
bool begins(const LogRecord &record, const std::string &text)
{
    return record.message.compare(0, text.size(), text) == 0;
}

class RemoteCancellation : public DaemonFixture
{
  protected:
    /// A script that passes the server's answers on, a little at a time. When a tenth has gone
    /// through, the host asks for the end, and the rest comes so slowly that nobody waits for it.
    std::function<void(Connection &)> slowlyAndAsking()
    {
        RelayPlan plan;
        plan.blockSize = 8192;
        plan.pause = std::chrono::milliseconds(1);
        plan.decide = [this](std::size_t toClient, std::size_t)
        {
            transferred_ = toClient;
            if (toClient < size / 10)
                return Fate::GoesOn;
            if (!asked_.exchange(true))
                interactor_->cancel();
            std::this_thread::sleep_for(std::chrono::milliseconds(50));
            return Fate::GoesOn;
        };
        return relayTo(server().port(), plan);
    }

    /// For a clone into the test's only folder.
    testing::AssertionResult isCloneCancelled(const std::string &url) const
    {
        return isCancelled([&] { generate(url); });
    }
    void generate(const std::string &url) const
    {
        generator_->generate(asUtf16(url), asPath(clone_));
    }
    void expectCloneWorks() const
    {
        generate(url_);
        const GitRepository cloned(clone_);
        EXPECT_EQ(cloned.line({"rev-parse", "HEAD"}), commit_);
        expectSound(cloned);
    }
    /// A clone made by git, and a new commit on the server.
    GitRepository makeClonedBefore()
    {
        auto cloned = GitRepository::clone(url_, clone_);
        next_ = commitNoise(source_, 2);
        source_.git({"push", "--quiet", served_.path(), "HEAD:refs/heads/main"});
        return cloned;
    }

    const std::filesystem::path clone_ = folder() / "clone";
    const std::unique_ptr<vclink::WorkingCopyGenerator> generator_ = makeGenerator();
    std::atomic<bool> asked_{false};
    std::atomic<std::size_t> transferred_{0};
    std::string next_;
};

TEST_F(RemoteCancellation, AskedForBeforeTheStartStopsTheTransferAndThenACheckout)
{
    interactor_->cancel();
    EXPECT_TRUE(isCloneCancelled(url_));
    EXPECT_FALSE(std::filesystem::exists(clone_));
    EXPECT_TRUE(isCloneCancelled(url_)) << "the checkout has not seen the request yet";
    EXPECT_FALSE(std::filesystem::exists(clone_));
    expectCloneWorks();
}

TEST_F(RemoteCancellation, StopsTheTransferOfASlowServer)
{
    {
        const ScriptedServer slow(slowlyAndAsking());
        EXPECT_TRUE(isCloneCancelled(urlAt(slow.port())));
    }
    EXPECT_TRUE(asked_);
    EXPECT_LT(transferred_, size) << "it was not waited for the rest";
    EXPECT_FALSE(std::filesystem::exists(clone_));
    EXPECT_TRUE(isCloneCancelled(url_)) << "the checkout has not seen the request yet";
    expectCloneWorks();
}

TEST_F(RemoteCancellation, LeavesAnEmptyFolderThatWasThere)
{
    std::filesystem::create_directory(clone_);
    interactor_->cancel();
    EXPECT_TRUE(isCloneCancelled(url_));
    EXPECT_TRUE(std::filesystem::is_empty(clone_));
}

TEST_F(RemoteCancellation, StopsTheCheckoutOfAClone)
{
    int files = 0;
    {
        LogCapture log(git::SeverityProgress);
        log.onRecord(
            [&](const LogRecord &record)
            {
                if (begins(record, "Checkout Notify : ") && ++files == 10)
                    interactor_->cancel();
            });
        EXPECT_TRUE(isCloneCancelled(url_));
    }
    EXPECT_EQ(files, 10) << "the next file ends it";
    EXPECT_FALSE(std::filesystem::exists(clone_));
    EXPECT_TRUE(isCloneCancelled(url_)) << "the transfer has not seen the request yet";
    expectCloneWorks();
}

TEST_F(RemoteCancellation, OfAFetchLeavesTheReferencesAndTheNextFetchWorks)
{
    const auto cloned = makeClonedBefore();
    const std::string before = referencesOf(cloned);
    const auto adapter = makeAdapter(cloned);
    const auto remote = git::GitRemote::create("origin", *adapter);
    {
        const ScriptedServer slow(slowlyAndAsking());
        cloned.git({"remote", "set-url", "origin", urlAt(slow.port())});
        EXPECT_TRUE(isCancelled([&] { remote->fetch({}); }));
    }
    EXPECT_LT(transferred_, size) << "it was not waited for the rest";
    EXPECT_EQ(referencesOf(cloned), before);
    expectSound(cloned);

    cloned.git({"remote", "set-url", "origin", url_});
    remote->fetch({});
    EXPECT_EQ(cloned.line({"rev-parse", "refs/remotes/origin/main"}), next_);
    expectSound(cloned);
}

TEST_F(RemoteCancellation, OfAFetchStopsTheNextCheckoutOfTheAdapterToo)
{
    const auto cloned = makeClonedBefore();
    cloned.git({"branch", "older", "HEAD"});
    const auto adapter = makeAdapter(cloned);
    interactor_->cancel();
    const auto remote = git::GitRemote::create("origin", *adapter);
    EXPECT_TRUE(isCancelled([&] { remote->fetch({}); }));
    remote->fetch({});
    EXPECT_EQ(cloned.line({"rev-parse", "refs/remotes/origin/main"}), next_);

    const auto branches = git::BranchManager::create(*adapter);
    branches->createBranch({"newer", "refs/remotes/origin/main"});
    EXPECT_TRUE(isCancelled([&] { branches->switchBranch("newer"); }));
    EXPECT_EQ(cloned.line({"symbolic-ref", "HEAD"}), "refs/heads/main");
    expectSound(cloned);
    branches->switchBranch("newer");
    EXPECT_EQ(cloned.line({"rev-parse", "HEAD"}), next_);
    expectSound(cloned);
}

TEST_F(RemoteCancellation, OfAPushTakesEffectWhenTheServerSpeaks)
{
    served_.write("hooks/post-receive", "#!/bin/sh\necho 'thank you' >&2\n");
    served_.setMode("hooks/post-receive", 0755);
    auto cloned = GitRepository::clone(url_, clone_);
    const std::string id = cloned.commit("new");
    const auto adapter = makeAdapter(cloned);
    const auto remote = git::GitRemote::create("origin", *adapter);
    interactor_->cancel();
    EXPECT_TRUE(isCancelled([&] { remote->push({u"HEAD:refs/heads/new"}); }));
    EXPECT_EQ(servedId("refs/heads/new"), id) << "the server spoke when all was done";
    remote->push({u"HEAD:refs/heads/newer"});
    EXPECT_EQ(servedId("refs/heads/newer"), id);
}

TEST_F(RemoteCancellation, OfAPushToASilentServerWaitsForTheNextFetch)
{
    auto cloned = makeClonedBefore();
    const std::string id = cloned.commit("new");
    const auto adapter = makeAdapter(cloned);
    const auto remote = git::GitRemote::create("origin", *adapter);
    interactor_->cancel();
    remote->push({u"HEAD:refs/heads/new"});
    EXPECT_EQ(servedId("refs/heads/new"), id);
    EXPECT_EQ(remote->getRemoteHeads().size(), 4u) << "a listing does not ask either";
    EXPECT_TRUE(isCancelled([&] { remote->fetch({}); }));
    remote->fetch({});
    EXPECT_EQ(cloned.line({"rev-parse", "refs/remotes/origin/main"}), next_);
}

} // namespace
