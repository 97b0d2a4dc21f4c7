// SPDX-License-Identifier: MIT
#include <algorithm>
#include <chrono>
#include <csignal>
#include <filesystem>
#include <functional>
#include <iostream>
#include <string>
#include <thread>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "DaemonFixture.hpp"
#include "ScriptedServer.hpp"
#include "error/logging/severity.hpp"
#include "relay.hpp"
#include "support/Descriptors.hpp"
#include "support/LogCapture.hpp"

namespace
{

using namespace vclink::test;

/// A failure that says what it is.
void expectToldBy(const Failure &failure)
{
    EXPECT_LT(failure.code, 0);
    EXPECT_GT(failure.errorClass, 0);
    EXPECT_NE(failure.text, "");
    std::cout << "ends with " << testing::PrintToString(failure) << '\n';
}

/// Servers that can't be talked to at all, each behind every kind of address.
class UselessServer : public RemoteFixture, public testing::WithParamInterface<const char *>
{
  protected:
    /// Expects that every operation fails, and says so, against a server that does `script`.
    void expectFailures(const std::function<void(Connection &)> &script)
    {
        const NoDescriptorLeak leak;
        const ScriptedServer server(script);
        const std::string url = std::string(GetParam()) +
                                "127.0.0.1:" + std::to_string(server.port()) + "/repository.git";
        expectToldBy(failureOf([&] { clone(url, "clone"); }));
        EXPECT_FALSE(std::filesystem::exists(folder() / "clone"));

        auto working = makeRepository();
        working.commit("first");
        working.git({"remote", "add", "origin", url});
        expectToldBy(failureOf([&] { fetch(working); }));
        expectToldBy(failureOf([&] { heads(working); }));
        expectToldBy(failureOf([&] { push(working, {"HEAD:refs/heads/main"}); }));
        expectSound(working);
    }
};

TEST_P(UselessServer, ThatClosesAtOnceIsAFailure)
{
    expectFailures([](Connection &connection) { connection.close(); });
}

TEST_P(UselessServer, ThatResetsTheConnectionIsAFailure)
{
    expectFailures(
        [](Connection &connection)
        {
            connection.read(1);
            connection.reset();
        });
}

TEST_P(UselessServer, ThatSendsGarbageIsAFailure)
{
    expectFailures(
        [](Connection &connection)
        {
            std::string garbage = "!!";
            for (int i = 0; i < 20'000; ++i)
                garbage += static_cast<char>(i * 7919 % 251);
            connection.write(garbage);
            // Closing while something is unread would drop the garbage.
            connection.read(65536);
        });
}

INSTANTIATE_TEST_SUITE_P(Behind, UselessServer,
                         testing::Values("git://", "http://", "https://", "ssh://user@"),
                         [](const auto &instance)
                         {
                             const std::string scheme = instance.param;
                             return scheme.substr(0, scheme.find(':'));
                         });

/// Servers that begin well.
class MisbehavingServer : public DaemonFixture
{
  protected:
    /// Passes everything on until so much went to the client, then ends.
    std::function<void(Connection &)> endingAfter(std::size_t toClient, Fate fate) const
    {
        RelayPlan plan;
        plan.blockSize = std::min<std::size_t>(toClient, 4096);
        plan.decide = [toClient, fate](std::size_t done, std::size_t)
        { return done < toClient ? Fate::GoesOn : fate; };
        return relayTo(server().port(), plan);
    }
    void expectCloneFails(const std::function<void(Connection &)> &script)
    {
        const NoDescriptorLeak leak;
        const ScriptedServer broken(script);
        expectToldBy(failureOf([&] { clone(urlAt(broken.port()), "clone"); }));
        EXPECT_FALSE(std::filesystem::exists(folder() / "clone"));
    }
    /// The texts of the records of what the server says, one after the other.
    static std::string saidIn(const LogCapture &log)
    {
        const std::string beginning = " msgStr=";
        std::string said;
        for (const auto &message : log.messages())
        {
            if (message.compare(0, beginning.size(), beginning) == 0)
                said += message.substr(beginning.size());
        }
        return said;
    }
};

TEST_F(MisbehavingServer, ThatClosesInTheMiddleOfAPackIsAFailure)
{
    expectCloneFails(endingAfter(size / 2, Fate::Closes));
}

TEST_F(MisbehavingServer, ThatResetsInTheMiddleOfAPackIsAFailure)
{
    expectCloneFails(endingAfter(size / 2, Fate::Resets));
}

TEST_F(MisbehavingServer, ThatClosesInTheMiddleOfItsReferencesIsAFailure)
{
    expectCloneFails(endingAfter(20, Fate::Closes));
}

TEST_F(MisbehavingServer, InTheMiddleOfAFetchLeavesTheReferences)
{
    const auto cloned = GitRepository::clone(url_, folder() / "clone");
    const std::string id = commitNoise(source_, 2);
    source_.git({"push", "--quiet", served_.path(), "HEAD:refs/heads/main"});
    const std::string before = referencesOf(cloned);
    {
        const ScriptedServer broken(endingAfter(size / 2, Fate::Closes));
        cloned.git({"remote", "set-url", "origin", urlAt(broken.port())});
        expectToldBy(failureOf([&] { fetch(cloned); }));
    }
    EXPECT_EQ(referencesOf(cloned), before);
    expectSound(cloned);
    cloned.git({"remote", "set-url", "origin", url_});
    fetch(cloned);
    EXPECT_EQ(cloned.line({"rev-parse", "refs/remotes/origin/main"}), id);
}

TEST_F(MisbehavingServer, ThatTalksForAMebibyteIsHeardToTheEnd)
{
    // What packs the objects speaks through the server; the setting is taken from its home only.
    served_.write("talk", "#!/bin/sh\nhead -c 1048576 /dev/zero | tr '\\0' x >&2\nexec \"$@\"\n");
    served_.setMode("talk", 0755);
    const auto settings = server().writeSettings(
        "[uploadpack]\npackObjectsHook = " + (served_ / "talk").string() + "\n");
    const LogCapture log(vclink::git::SeverityParameter);
    EXPECT_EQ(clone(url_, "clone").line({"rev-parse", "HEAD"}), commit_);
    const std::string said = saidIn(log);
    EXPECT_EQ(std::count(said.begin(), said.end(), 'x'), 1'048'576);
}

TEST_F(MisbehavingServer, ThatTalksForAMebibyteAfterAPushIsHeardToTheEnd)
{
    served_.write("hooks/post-receive", "#!/bin/sh\nhead -c 1048576 /dev/zero | tr '\\0' x >&2\n");
    served_.setMode("hooks/post-receive", 0755);
    auto cloned = GitRepository::clone(url_, folder() / "clone");
    const std::string id = cloned.commit("new");
    const LogCapture log(vclink::git::SeverityParameter);
    push(cloned, {"HEAD:refs/heads/new"});
    EXPECT_EQ(servedId("refs/heads/new"), id);
    const std::string said = saidIn(log);
    EXPECT_EQ(std::count(said.begin(), said.end(), 'x'), 1'048'576);
}

TEST_F(MisbehavingServer, ThatStaysSilentHoldsTheRequestForCancellationUntilItCloses)
{
    const auto generator = makeGenerator();
    const auto generate = [&](const std::string &url)
    { generator->generate(asUtf16(url), asPath(folder() / "clone")); };
    {
        const ScriptedServer silent(
            [this](Connection &connection)
            {
                connection.readUntil("repository");
                interactor_->cancel();
                std::this_thread::sleep_for(std::chrono::milliseconds(200));
            });
        expectToldBy(failureOf([&] { generate(urlAt(silent.port())); }));
    }
    EXPECT_TRUE(isCancelled([&] { generate(url_); })) << "in the transfer";
    EXPECT_TRUE(isCancelled([&] { generate(url_); })) << "in the checkout";
    generate(url_);
    EXPECT_EQ(GitRepository(folder() / "clone").line({"rev-parse", "HEAD"}), commit_);
}

/// A server that goes away while the client writes, in a process that SIGPIPE would end.
class BrokenPush : public MisbehavingServer, public testing::WithParamInterface<Fate>
{
  protected:
    BrokenPush() : actionBefore_(::signal(SIGPIPE, SIG_DFL))
    {
    }
    ~BrokenPush() override
    {
        ::signal(SIGPIPE, actionBefore_);
    }

  private:
    void (*actionBefore_)(int);
};

TEST_P(BrokenPush, IsAFailureAndTheProcessLives)
{
    auto cloned = GitRepository::clone(url_, folder() / "clone");
    // More than the system takes off the client's hands before anybody reads it.
    const std::string id = commitNoise(cloned, 3, 5'000'000);
    {
        RelayPlan plan;
        plan.blockSize = 4096;
        plan.decide = [](std::size_t, std::size_t toServer)
        { return toServer < size / 2 ? Fate::GoesOn : GetParam(); };
        const ScriptedServer broken(relayTo(server().port(), plan));
        cloned.git({"remote", "set-url", "origin", urlAt(broken.port())});
        expectToldBy(failureOf([&] { push(cloned, {"HEAD:refs/heads/new"}); }));
    }
    EXPECT_EQ(servedId("refs/heads/new"), "");
    expectSound(cloned);

    sigset_t blocked;
    ::sigprocmask(SIG_BLOCK, nullptr, &blocked);
    EXPECT_EQ(::sigismember(&blocked, SIGPIPE), 0);
    sigset_t pending;
    ::sigpending(&pending);
    EXPECT_EQ(::sigismember(&pending, SIGPIPE), 0);

    cloned.git({"remote", "set-url", "origin", url_});
    push(cloned, {"HEAD:refs/heads/new"});
    EXPECT_EQ(servedId("refs/heads/new"), id);
}

INSTANTIATE_TEST_SUITE_P(Server, BrokenPush, testing::Values(Fate::Closes, Fate::Resets),
                         testing::PrintToStringParamName());

} // namespace
