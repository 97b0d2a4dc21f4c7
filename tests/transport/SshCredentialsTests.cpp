// SPDX-License-Identifier: MIT
#include <chrono>
#include <cstdlib>
#include <filesystem>
#include <iostream>
#include <string>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <git2/errors.h>

#include "RemoteFixture.hpp"
#include "ServerOfTheSuite.hpp"
#include "SshAgent.hpp"
#include "SshServer.hpp"
#include "error/logging/severity.hpp"
#include "support/LogCapture.hpp"
#include "support/libgit2Release.hpp"

namespace
{

using testing::HasSubstr;
using namespace vclink::test;

/// A repository with one commit, on a server that lets one key in.
class SshCredentials : public ServerOfTheSuite<SshServer>, public RemoteFixture
{
  protected:
    using ServerOfTheSuite<SshServer>::TearDownTestSuite;
    SshCredentials()
    {
        auto source = makeRepository("source");
        commit_ = source.commit("first");
        source.git({"push", "--quiet", served_.path(), "HEAD:refs/heads/main"});
    }

    static void useAgent(const std::string &socket)
    {
        ::setenv("SSH_AUTH_SOCK", socket.c_str(), 1);
    }
    /// A key that the server does not know.
    std::filesystem::path makeStrangeKey(int number) const
    {
        const auto key = folder() / ("key" + std::to_string(number));
        makeSshKey(key);
        return key;
    }
    /// How a clone that must not go through ends. It ends by itself, and within a time.
    Failure refusalOf(const std::string &url)
    {
        const LogCapture log(vclink::git::SeverityParameter);
        const auto start = std::chrono::steady_clock::now();
        const auto failure = failureOf([&] { clone(url, "clone"); });
        EXPECT_LT(std::chrono::steady_clock::now() - start, std::chrono::seconds(60));
        EXPECT_FALSE(std::filesystem::exists(folder() / "clone"));
        for (const auto &message : log.messages())
            requests_ += message.find(" username_from_url=") != std::string::npos ? 1 : 0;
        std::cout << "ends with " << testing::PrintToString(failure) << ", after " << requests_
                  << " requests for credentials\n";
        return failure;
    }
    /// The server had enough: it hung up after a few tries.
    void expectHangUp(const Failure &failure) const
    {
        EXPECT_EQ(failure.code, GIT_EAUTH);
        EXPECT_EQ(failure.errorClass, GIT_ERROR_SSH);
        EXPECT_THAT(failure.text, testing::ContainsRegex(libgit2_release::endOfSshTries));
        EXPECT_GE(requests_, 1);
        EXPECT_LE(requests_, 7);
    }

    void expectMissingAgent(const std::string &reason)
    {
        const auto failure = refusalOf(url_);
        if (!libgit2_release::tellsOfMissingAgent)
        {
            expectHangUp(failure);
            return;
        }
        EXPECT_EQ(failure.code, GIT_ERROR);
        EXPECT_EQ(failure.errorClass, GIT_ERROR_SSH);
        EXPECT_THAT(failure.text, HasSubstr(reason));
        EXPECT_EQ(requests_, 1);
    }

    GitRepository served_ = server().makeRepository();
    std::string url_ = server().url(served_);
    std::string commit_;
    int requests_ = 0;
};

TEST_F(SshCredentials, OfAKnownKeyInTheAgentAreAccepted)
{
    server().prepareClient();
    EXPECT_EQ(clone(url_, "clone").line({"rev-parse", "HEAD"}), commit_);
}

TEST_F(SshCredentials, OfAKnownKeyBehindAStrangeOneAreAccepted)
{
    const SshAgent agent;
    agent.add(makeStrangeKey(0));
    agent.add(server().key());
    useAgent(agent.socket());
    EXPECT_EQ(clone(url_, "clone").line({"rev-parse", "HEAD"}), commit_);
}

TEST_F(SshCredentials, OfAStrangeKeyAreRefused)
{
    const SshAgent agent;
    agent.add(makeStrangeKey(0));
    useAgent(agent.socket());
    expectHangUp(refusalOf(url_));
}

TEST_F(SshCredentials, OfTenStrangeKeysAreRefused)
{
    const SshAgent agent;
    for (int i = 0; i < 10; ++i)
        agent.add(makeStrangeKey(i));
    useAgent(agent.socket());
    expectHangUp(refusalOf(url_));
}

TEST_F(SshCredentials, OfAnEmptyAgentAreRefused)
{
    const SshAgent agent;
    useAgent(agent.socket());
    expectHangUp(refusalOf(url_));
}

TEST_F(SshCredentials, AreMissingWithoutAnAgent)
{
    ::unsetenv("SSH_AUTH_SOCK");
    expectMissingAgent("no auth sock variable");
}

TEST_F(SshCredentials, AreMissingWhereTheAgentsSocketIsNot)
{
    useAgent(folder() / "nothing");
    expectMissingAgent("failed connecting with agent");
}

TEST_F(SshCredentials, HaveNoUserWhereTheAddressHasNone)
{
    server().prepareClient();
    const auto failure =
        refusalOf(server().baseWithoutUser() + "/" + served_.path().filename().string());
    EXPECT_EQ(failure.code, GIT_ERROR);
    EXPECT_EQ(requests_, 1);
}

/// A server that takes passwords only.
class SshPasswords : public RemoteFixture
{
  protected:
    SshServer server_{SshServer::Offers::Passwords};
};

TEST_F(SshPasswords, AreNotGiven)
{
    server_.prepareClient();
    const auto served = server_.makeRepository();
    const auto failure = failureOf([&] { clone(server_.url(served), "clone"); });
    std::cout << "ends with " << testing::PrintToString(failure) << '\n';
    EXPECT_EQ(failure.code, GIT_ERROR);
    EXPECT_FALSE(std::filesystem::exists(folder() / "clone"));
}

} // namespace
