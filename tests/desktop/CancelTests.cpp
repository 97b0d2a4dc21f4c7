// SPDX-License-Identifier: MIT
// When Cancel works, when it comes too late, and a window that goes on while the library works. A
// locked HEAD makes an operation wait before it writes anything.
#include <chrono>
#include <filesystem>
#include <string>

#include <QStatusBar>
#include <QTimer>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "DesktopFixture.hpp"
#include "support/Change.hpp"
#include "text.hpp"

namespace
{

using namespace vclink::test;
using testing::HasSubstr;
using vclink::desktop::toUtf8;

class Cancel : public DesktopFixture
{
  protected:
    Cancel()
    {
        repository_.write("a", "first\n");
        repository_.commitAll("first");
        repository_.git({"branch", "same"});
        repository_.makeBranch("topic", writes("a", "topic\n"));
        repository_.git({"config", "core.filesRefLockTimeout", "20000"});
    }
    void makeManyFiles(int count)
    {
        std::vector<std::string> names;
        for (int file = 0; file < count; ++file)
            names.push_back("folder" + std::to_string(file % 50) + "/" + std::to_string(file));
        repository_.makeBranch("many", writesEach(names, "text\n"));
    }
    void lock(const std::string &reference)
    {
        repository_.write(".git/" + reference + ".lock", "");
    }
    void unlock(const std::string &reference)
    {
        std::filesystem::remove(repository_ / (".git/" + reference + ".lock"));
    }
    void beginSwitch(const std::string &branch)
    {
        choose("switch");
        fill({vclink::desktop::fromUtf8(branch)});
    }
    QPushButton &button()
    {
        return find<QPushButton>("cancel");
    }
    bool becomesEnabled()
    {
        return waitFor([this] { return button().isEnabled(); });
    }
    std::string head() const
    {
        return repository_.line({"symbolic-ref", "--short", "HEAD"});
    }
    std::string told()
    {
        return toUtf8(window().statusBar()->currentMessage());
    }
};

TEST_F(Cancel, EndsASwitchBeforeItWritesAnything)
{
    open();
    lock("HEAD");
    beginSwitch("topic");
    ASSERT_TRUE(becomesEnabled());
    button().click();
    EXPECT_FALSE(button().isEnabled());
    unlock("HEAD");
    settle();
    EXPECT_EQ(told(), "Cancelled. No file has been written.");
    EXPECT_EQ(head(), "main");
    EXPECT_EQ(repository_.read("a"), "first\n");
}

TEST_F(Cancel, EndsAMergeAsACancellation)
{
    open();
    lock("refs/heads/main");
    choose("merge");
    fill({"topic"});
    ASSERT_TRUE(becomesEnabled());
    button().click();
    unlock("refs/heads/main");
    settle();
    EXPECT_EQ(told(), "Cancelled. No file has been written.");
    EXPECT_EQ(repository_.read("a"), "first\n");
}

TEST_F(Cancel, ThatComesTooLateStopsNothingElse)
{
    open();
    lock("HEAD");
    // Nothing has to be written for it, so that nothing asks.
    beginSwitch("same");
    ASSERT_TRUE(becomesEnabled());
    button().click();
    unlock("HEAD");
    settle();
    EXPECT_EQ(told(), "Too late to cancel: it was done already.");
    EXPECT_EQ(head(), "same");
    beginSwitch("topic");
    settle();
    EXPECT_EQ(head(), "topic");
}

TEST_F(Cancel, IsNotOfferedWhileFilesAreWritten)
{
    std::vector<std::pair<bool, bool>> seen;
    vclink::desktop::Runner *used = nullptr;
    vclink::desktop::RunnerListener listener;
    listener.changed = [] {};
    listener.told = [](const QString &) {};
    listener.refreshed = [](const auto &) {};
    listener.failed = [](const auto &, const host_tools::Failure &failure)
    { FAIL() << toUtf8(vclink::desktop::toQString(failure.text)); };
    listener.progress = [&](double, const QString &)
    {
        seen.emplace_back(used->current() != nullptr, used->canCancel());
        used->cancel();
    };
    makeManyFiles(300);
    vclink::desktop::Runner runner(guards_, listener);
    used = &runner;
    runner.setRoot(host_tools::toUpath(repository_.path()));
    vclink::desktop::Operation operation;
    operation.kind = vclink::desktop::Operation::Kind::Checkout;
    operation.run = [](vclink::desktop::Work &work) { work.branches()->switchBranch("many"); };
    runner.run(operation);
    ASSERT_TRUE(waitFor([&runner] { return runner.isSettled(); }));
    EXPECT_EQ(head(), "many");
    ASSERT_FALSE(seen.empty());
    for (const auto &[runs, canCancel] : seen)
    {
        EXPECT_TRUE(runs);
        EXPECT_FALSE(canCancel);
    }
}

TEST_F(Cancel, IsNotOfferedForWhatCannotBeStopped)
{
    open();
    repository_.write("a", "second\n");
    lock("refs/heads/main");
    choose("commit");
    fill({"Second"});
    ASSERT_TRUE(waitFor([this] { return find<QWidget>("progress").isVisible(); }));
    EXPECT_FALSE(button().isEnabled());
    unlock("refs/heads/main");
    settle();
    EXPECT_EQ(repository_.line({"log", "-1", "--format=%s"}), "Second");
}

TEST_F(Cancel, LeavesTheWindowResponsiveDuringALongSwitch)
{
    makeManyFiles(3'000);
    open();
    using Clock = std::chrono::steady_clock;
    QTimer timer;
    int ticks = 0;
    QObject::connect(&timer, &QTimer::timeout, &timer, [&ticks] { ++ticks; });
    timer.start(5);
    const auto begin = Clock::now();
    beginSwitch("many");
    ASSERT_TRUE(waitFor([this] { return window().runner().current() == nullptr; }));
    const auto milliseconds =
        std::chrono::duration_cast<std::chrono::milliseconds>(Clock::now() - begin).count();
    EXPECT_EQ(head(), "many");
    // A window that waits for the library has no more than a few.
    EXPECT_GE(ticks, milliseconds / 50);
    EXPECT_GE(ticks, 4);
}

TEST_F(Cancel, ClosingShowsWhatFailedAndStays)
{
    repository_.git({"config", "core.filesRefLockTimeout", "500"});
    repository_.write("a", "second\n");
    open();
    lock("refs/heads/main");
    choose("commit");
    fill({"Second"});
    ASSERT_TRUE(waitFor([this] { return window().runner().current() != nullptr; }));
    window().close();
    EXPECT_THAT(takeMessage(), HasSubstr("lock"));
    settle();
    EXPECT_TRUE(window().isVisible());
}

TEST_F(Cancel, IsAskedByClosingTheWindowWhichThenWaits)
{
    open();
    lock("HEAD");
    beginSwitch("topic");
    ASSERT_TRUE(becomesEnabled());
    window().close();
    EXPECT_TRUE(window().isVisible());
    unlock("HEAD");
    EXPECT_TRUE(waitFor([this] { return !window().isVisible(); }));
    EXPECT_EQ(head(), "main");
}

TEST_F(Cancel, ClosingWaitsForWhatCannotBeStopped)
{
    open();
    repository_.write("a", "second\n");
    lock("refs/heads/main");
    choose("commit");
    fill({"Second"});
    ASSERT_TRUE(waitFor([this] { return window().runner().current() != nullptr; }));
    window().close();
    EXPECT_TRUE(window().isVisible());
    EXPECT_THAT(told(), HasSubstr("Closing as soon as this has ended: Commit"));
    unlock("refs/heads/main");
    EXPECT_TRUE(waitFor([this] { return !window().isVisible(); }));
    EXPECT_EQ(repository_.line({"log", "-1", "--format=%s"}), "Second");
}

} // namespace
