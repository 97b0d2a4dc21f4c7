// SPDX-License-Identifier: MIT
// Fetch, push and clone with a server, and one that is silent.
#include <memory>
#include <string>

#include <QProgressBar>
#include <QStatusBar>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "DesktopFixture.hpp"
#include "text.hpp"
#include "transport/GitDaemon.hpp"
#include "transport/ScriptedServer.hpp"
#include "transport/ServerOfTheSuite.hpp"

namespace
{

using namespace vclink::test;
using testing::HasSubstr;
using vclink::desktop::fromUtf8;
using vclink::desktop::toUtf8;

class RemoteCommands : public ServerOfTheSuite<GitDaemon>, public DesktopFixture
{
  protected:
    using ServerOfTheSuite<GitDaemon>::TearDownTestSuite;
    RemoteCommands()
    {
        repository_.write("a", "first\n");
        repository_.commitAll("first");
        repository_.git({"remote", "add", "origin", url_});
        repository_.git({"push", "--quiet", served_.path().string(), "main"});
    }
    std::string servedId() const
    {
        return served_.line({"rev-parse", "main"});
    }
    void choose(const std::string &command, const QStringList &values)
    {
        DesktopFixture::choose(command);
        fill(values);
    }

    GitRepository served_ = server().makeRepository();
    std::string url_ = server().url(served_);
};

TEST_F(RemoteCommands, FetchBringsTheBranches)
{
    auto author = GitRepository::clone(served_.path(), folder() / "author");
    author.write("b", "new\n");
    author.commitAll("new");
    author.git({"push", "--quiet", "origin", "main"});
    open();
    choose("fetch", {"origin"});
    settle();
    EXPECT_EQ(repository_.line({"rev-parse", "origin/main"}), servedId());
    choose("merge", {"origin/main"});
    settle();
    EXPECT_EQ(repository_.read("b"), "new\n");
}

TEST_F(RemoteCommands, PushSendsTheCurrentBranch)
{
    open();
    repository_.write("a", "second\n");
    const std::string id = repository_.commitAll("second");
    choose("push", {"origin"});
    settle();
    EXPECT_EQ(servedId(), id);
}

TEST_F(RemoteCommands, PushTellsThatTheServerRejectedTheBranch)
{
    open();
    served_.write("hooks/update", "#!/bin/sh\nexit 1\n");
    served_.setMode("hooks/update", 0755);
    const std::string before = servedId();
    repository_.write("a", "second\n");
    repository_.commitAll("second");
    choose("push", {"origin"});
    EXPECT_THAT(takeMessage(), HasSubstr("rejected the branch \"main\""));
    EXPECT_EQ(servedId(), before);
}

TEST_F(RemoteCommands, CloneShowsTheNewWorkingCopy)
{
    openEmpty();
    const std::string target = (folder() / "clone").string();
    choose("clone", {fromUtf8(url_), fromUtf8(target)});
    ASSERT_TRUE(waitFor([this] { return !window().snapshot().root.string().empty(); }));
    EXPECT_EQ(GitRepository(target).read("a"), "first\n");
    EXPECT_EQ(window().snapshot().branch, "main");
}

TEST_F(RemoteCommands, AnUnknownRemoteIsAFailureWithLibGit2sCode)
{
    open();
    choose("fetch", {"nowhere"});
    EXPECT_THAT(toUtf8(shown<QMessageBox>().detailedText()), HasSubstr("libgit2: "));
}

TEST_F(RemoteCommands, ASilentServerKeepsTheWindowAliveWithABusyBarAndCancel)
{
    const auto server =
        std::make_unique<ScriptedServer>([](Connection &connection) { connection.waitForClose(); });
    repository_.git(
        {"remote", "add", "silent", "git://127.0.0.1:" + std::to_string(server->port()) + "/x"});
    open();
    choose("fetch", {"silent"});
    auto &cancel = find<QPushButton>("cancel");
    ASSERT_TRUE(waitFor([&cancel] { return cancel.isEnabled(); }));
    EXPECT_EQ(find<QProgressBar>("bar").maximum(), 0);
    window().close();
    EXPECT_TRUE(window().isVisible());
    EXPECT_FALSE(cancel.isEnabled());
    // Only the second time is the person asked whether to end at once.
    window().close();
    auto &box = shown<QMessageBox>();
    EXPECT_THAT(toUtf8(box.text()), HasSubstr("does not answer"));
    box.button(QMessageBox::Cancel)->click();
}

} // namespace
