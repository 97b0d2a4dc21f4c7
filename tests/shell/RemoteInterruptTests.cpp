// SPDX-License-Identifier: MIT
#include <chrono>
#include <csignal>
#include <future>
#include <thread>

#include <gmock/gmock.h>

#include "ShellRemoteFixture.hpp"
#include "TerminalProcess.hpp"
#include "transport/ScriptedServer.hpp"
#include "transport/relay.hpp"

namespace vclink::test
{
namespace
{

using testing::EndsWith;
using testing::HasSubstr;
using testing::Not;

/// Real signals, sent when it is known how far the program is.
class ShellRemoteInterrupt : public ShellRemoteFixture
{
  protected:
    TerminalProcess start(const std::vector<std::string> &arguments) const
    {
        return TerminalProcess(onTerminal("xterm", arguments), repository_.path());
    }

    /// Runs the program, sends it Ctrl-C when this has appeared, and expects it to end with 130.
    std::string cancel(const std::vector<std::string> &arguments, const std::string &sign) const
    {
        TerminalProcess process = start(arguments);
        process.readUntil(sign);
        process.interrupt();
        const TerminalResult result = process.end();
        EXPECT_EQ(result.exitStatus, 130) << result.text;
        EXPECT_THAT(result.text, EndsWith("vclink-shell: The operation was cancelled.\n"));
        return result.text;
    }

    /// Gives the served repository 2 MB that can't be packed, and many names.
    void serveMuch() const
    {
        GitRepository colleague = GitRepository::clone(url_, folder() / "colleague");
        unsigned state = 1;
        for (int number = 0; number < 40; ++number)
        {
            std::string noise(50'000, '\0');
            for (char &byte : noise)
            {
                state = state * 1664525 + 1013904223;
                byte = static_cast<char>(state >> 24);
            }
            colleague.write("noise/" + std::to_string(number), noise);
        }
        // Long, so that what is written of each file soon fills the terminal.
        for (int number = 0; number < 1000; ++number)
            colleague.write("many/" + std::string(150, 'x') + std::to_string(number), "");
        colleague.commitAll("much");
        colleague.git({"push", "--quiet", "origin", "main"});
    }

    /// The daemon's address behind a server that passes on what it sends little by little, ten
    /// seconds' worth.
    ScriptedServer slowServer() const
    {
        RelayPlan plan;
        plan.blockSize = 4096;
        plan.pause = std::chrono::milliseconds(20);
        return ScriptedServer(relayTo(server().port(), plan));
    }
    std::string urlAt(const ScriptedServer &scripted, const std::string &name) const
    {
        return "git://127.0.0.1:" + std::to_string(scripted.port()) + name;
    }
    /// The repository's address there.
    std::string urlAt(const ScriptedServer &scripted) const
    {
        return urlAt(scripted, url_.substr(server().base().size()));
    }
};

TEST_F(ShellRemoteInterrupt, CancelsACloneWhileItIsSentAndLeavesNothing)
{
    serveMuch();
    const ScriptedServer slow = slowServer();
    cancel({"--log", "progress", "clone", urlAt(slow), "clone"}, "Transfer Progress");
    EXPECT_FALSE(std::filesystem::exists(repository_ / "clone"));
    succeed({"clone", url_, "clone"});
}

TEST_F(ShellRemoteInterrupt, CancelsACloneBeforeFilesAreWrittenAndLeavesNothing)
{
    serveMuch();
    cancel({"--log", "progress", "clone", url_, "clone"}, "Checkout Notify");
    EXPECT_FALSE(std::filesystem::exists(repository_ / "clone"));
}

TEST_F(ShellRemoteInterrupt, CancelsAFetchWhichCanBeDoneAgain)
{
    serveMuch();
    const ScriptedServer slow = slowServer();
    repository_.git({"remote", "set-url", "origin", urlAt(slow)});
    const References before = references(repository_);
    cancel({"--log", "progress", "fetch", "origin"}, "Transfer Progress");
    EXPECT_EQ(references(repository_), before);
    EXPECT_EQ(repository_.git({"fsck", "--no-progress"}), "");
    repository_.git({"remote", "set-url", "origin", url_});
    succeed({"fetch", "origin"});
    EXPECT_EQ(references(repository_).at("refs/remotes/origin/main"),
              references(served_).at("refs/heads/main"));
}

TEST_F(ShellRemoteInterrupt, CancelsAPushWhileTheServerTalks)
{
    const References before = references(served_);
    repository_.write("a", "ours\n");
    repository_.commitAll("our work");
    served_.write("hooks/pre-receive", "#!/bin/sh\nfor number in $(seq 600); do\n"
                                       "    echo busy\n    sleep 0.1\ndone\nexit 1\n");
    served_.setMode("hooks/pre-receive", 0755);
    cancel({"--log", "parameter", "push", "origin", "refs/heads/main"}, "msgStr=busy");
    EXPECT_EQ(references(served_), before);
}

TEST_F(ShellRemoteInterrupt, MarksTheLinesOfAServersError)
{
    const std::string error = "ERR no\nvclink-shell: Everything is fine.\n\xE2\x80\xAE";
    const ScriptedServer server(
        [&error](Connection &connection)
        {
            connection.readUntil("git-upload-pack");
            connection.write("00" + std::string(1, "0123456789abcdef"[(error.size() + 4) / 16]) +
                             "0123456789abcdef"[(error.size() + 4) % 16] + error);
            connection.waitForClose();
        });
    repository_.git({"remote", "set-url", "origin", urlAt(server, "/repository.git")});
    const CommandResult result = run({"fetch"});
    EXPECT_EQ(result.exitStatus, 1);
    EXPECT_THAT(result.errors, HasSubstr("no\nremote: vclink-shell: Everything is fine.\n"));
    EXPECT_THAT(result.errors, Not(HasSubstr("\nvclink-shell: Everything")));
}

/// A server that takes a request and says nothing.
class ShellSilentServer : public ShellRemoteInterrupt
{
  protected:
    ShellSilentServer()
    {
        repository_.git({"remote", "set-url", "origin", urlAt(server_, "/repository.git")});
    }

    /// Until the program waits for the answer.
    void waitForRequest()
    {
        ASSERT_EQ(asked_.get_future().wait_for(std::chrono::minutes(1)), std::future_status::ready);
    }

    std::promise<void> asked_;
    ScriptedServer server_{[this](Connection &connection)
                           {
                               connection.readUntil("git-upload-pack");
                               asked_.set_value();
                               connection.waitForClose();
                           }};
};

TEST_F(ShellSilentServer, IsGivenUpByASecondCtrlCAfterThreeSecondsAndLeftByAThird)
{
    TerminalProcess process = start({"fetch", "origin"});
    waitForRequest();
    process.interrupt();
    // The three seconds, and what a busy machine needs to hear of the first.
    std::this_thread::sleep_for(std::chrono::seconds(5));
    process.interrupt();
    process.readUntil("vclink-shell: The operation makes no progress. The next Ctrl-C ends the "
                      "program at once.\n");
    process.interrupt();
    EXPECT_EQ(process.end().exitStatus, -SIGINT);
}

TEST_F(ShellSilentServer, IsWaitedForWithAClockAndToldOfTheRequest)
{
    TerminalProcess process = start({"fetch"});
    process.readUntil("\r\33[KFetching from origin: 0:00");
    process.readUntil("\r\33[KFetching from origin: 0:01");
    process.interrupt();
    process.readUntil("\r\33[KCancelling.\n");
    process.readUntil("\r\33[KFetching from origin: 0:03");
}

TEST_F(ShellSilentServer, IsLeftByTheFirstCtrlCWhereNothingCanBeCancelled)
{
    TerminalProcess process = start({"heads", "origin"});
    waitForRequest();
    process.interrupt();
    EXPECT_EQ(process.end().exitStatus, -SIGINT);
}

TEST_F(ShellRemoteInterrupt, EndsWithAFailureThatCameMeanwhile)
{
    std::promise<void> asked;
    std::promise<void> interrupted;
    const ScriptedServer server(
        [&](Connection &connection)
        {
            connection.readUntil("git-upload-pack");
            asked.set_value();
            interrupted.get_future().wait_for(std::chrono::minutes(1));
        });
    repository_.git({"remote", "set-url", "origin", urlAt(server, "/repository.git")});
    TerminalProcess process = start({"--progress", "never", "fetch", "origin"});
    ASSERT_EQ(asked.get_future().wait_for(std::chrono::minutes(1)), std::future_status::ready);
    process.interrupt();
    std::this_thread::sleep_for(std::chrono::seconds(1));
    interrupted.set_value();
    const TerminalResult result = process.end();
    EXPECT_EQ(result.exitStatus, 130) << result.text;
    EXPECT_THAT(result.text, HasSubstr("vclink-shell: Git could not complete the operation"));
}

} // namespace
} // namespace vclink::test
