// SPDX-License-Identifier: MIT
#include "main/checkout/RemadeFiles.hpp"

#include <csignal>
#include <filesystem>
#include <functional>
#include <string>
#include <vector>

#include <fcntl.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include "ObstacleFixture.hpp"
#include "support/UnprivilegedUser.hpp"
#include "support/text.hpp"

namespace
{

namespace fs = std::filesystem;
using testing::HasSubstr;
using namespace vclink::test;

/// Tracked files that libgit2 cannot open for writing, between others that it writes. git creates
/// them again.
class UnwritableFiles : public ObstacleFixture
{
  protected:
    UnwritableFiles()
    {
        repository_.commitAll(writesEach({"a", "d/r", "z"}, "old\n"), "files");
    }
    /// What `action` comes to as the user of the working copy, who may not write to "d/r".
    std::string unprivileged(const std::function<void()> &action) const
    {
        repository_.git({"config", "--global", "safe.directory", "*"});
        giveToUnprivilegedUser(folder().path());
        repository_.setMode("d/r", 0444);
        return runAsUnprivilegedUser(
            [&]
            {
                try
                {
                    action();
                }
                catch (const std::exception &exception)
                {
                    return std::string(exception.what());
                }
                return std::string();
            });
    }
    void expectMergeRefusedIn(const std::string &closed) const
    {
        EXPECT_EQ(runUnprivileged(closed, 0555, [this] { return failureOfMerge("topic"); }),
                  textOf(refusal("the folder '" + closed + "/' cannot be written to")));
    }
    void expectAll(const std::string &content) const
    {
        for (const auto *name : {"a", "d/r", "z"})
            EXPECT_EQ(repository_.read(name), content) << name;
    }
    void expectMode(const std::string &name, mode_t mode) const
    {
        struct stat status = {};
        ASSERT_EQ(::stat((repository_ / name).c_str(), &status), 0);
        EXPECT_EQ(status.st_mode & ALLPERMS, mode);
    }
    /// What the switch to "topic" throws for a user who may not write to the folder "d".
    std::string switchByAnother() const
    {
        return runAsUnprivilegedUser(
            [this] { return failureOf([this] { branches().switchBranch("topic"); }).text; });
    }

    /// Changes all of them, and adds a file.
    const Change changesAll_ = writesEach({"a", "d/r", "n", "z"}, "theirs\n");
};

TEST_F(UnwritableFiles, AreMadeAnewByASwitch)
{
    makeBranch("topic", changesAll_);
    EXPECT_EQ(unprivileged([this] { branches().switchBranch("topic"); }), "");
    expectAll("theirs\n");
    expectMode("d/r", 0644);
    EXPECT_EQ(currentBranch(), "refs/heads/topic");
}

TEST_F(UnwritableFiles, AreMadeAnewByAFastForward)
{
    makeBranch("topic", changesAll_);
    EXPECT_EQ(unprivileged([this] { merge("topic"); }), "");
    expectAll("theirs\n");
    EXPECT_EQ(idOf("HEAD"), idOf("topic"));
}

TEST_F(UnwritableFiles, AreMadeAnewByAMerge)
{
    diverge(writes("ours", "x"), changesAll_);
    EXPECT_EQ(unprivileged([this] { merge("topic"); }), "");
    expectAll("theirs\n");
    EXPECT_EQ(parents().size(), 2U);
}

TEST_F(UnwritableFiles, InConflictAreMadeAnewByAMerge)
{
    repository_.commitAll(writes(".gitattributes", "z -merge\n"), "attributes");
    diverge(writesEach({"a", "d/r", "z"}, "ours\n"),
            writes("a", "theirs\n") + writes("z", "theirs\n") + removes("d/r"));
    const std::string text = unprivileged(
        [this]
        {
            for (const auto *name : {"a", "z"})
                repository_.setMode(name, 0444);
            expectConflicts("topic");
        });
    EXPECT_EQ(text, "");
    EXPECT_EQ(repository_.read("z"), "ours\n");
    EXPECT_EQ(repository_.read("d/r"), "ours\n");
    EXPECT_EQ(conflicts().size(), 8U);
}

TEST_F(UnwritableFiles, AreRestoredByARevert)
{
    const auto all = [this]
    {
        std::vector<upath> files;
        for (const auto *name : {"a", "d/r", "z"})
            files.push_back(asPath((repository_ / name).string()));
        adapter_->revertFiles(files);
    };
    for (const auto *name : {"a", "d/r", "z"})
        repository_.write(name, "mine\n");
    EXPECT_EQ(unprivileged(all), "");
    expectAll("old\n");
    expectMode("d/r", 0644);
}

TEST_F(UnwritableFiles, ThatAreMissingInSuchAFolderStopARevertBeforeItWrites)
{
    repository_.write("a", "mine\n");
    repository_.remove("d/r");
    const auto revert = [this]
    {
        const std::vector<upath> files{asPath((repository_ / "a").string()),
                                       asPath((repository_ / "d/r").string())};
        return failureOf([&] { adapter_->revertFiles(files); }).text;
    };
    EXPECT_EQ(runUnprivileged("d", 0555, revert), "the file 'd/r' cannot be created in its folder");
}

TEST_F(UnwritableFiles, KeepThePermissionToExecute)
{
    repository_.setMode("d/r", 0755);
    repository_.commitAll("program");
    makeBranch("topic", changesAll_);
    const std::string text = unprivileged(
        [this]
        {
            repository_.setMode("d/r", 0555);
            branches().switchBranch("topic");
        });
    EXPECT_EQ(text, "");
    expectMode("d/r", 0755);
}

TEST_F(UnwritableFiles, ThatAreEditedAreLeftIfTheCheckoutIsRefused)
{
    makeBranch("topic", changesAll_);
    repository_.write("d/r", "mine\n");
    EXPECT_NE(unprivileged([this] { branches().switchBranch("topic"); }), "");
    EXPECT_EQ(repository_.read("d/r"), "mine\n");
    EXPECT_EQ(repository_.read("a"), "old\n");
    expectMode("d/r", 0444);
}

TEST_F(UnwritableFiles, InAFolderThatCannotBeWrittenToAreRefused)
{
    makeBranch("topic", changesAll_);
    giveToUnprivilegedUser(folder().path());
    repository_.setMode("d/r", 0444);
    repository_.setMode("d", 0555);
    const std::string text = switchByAnother();
    repository_.setMode("d", 0755);
    EXPECT_EQ(text, "the file 'd/r' cannot be written to, and its folder cannot be written to");
    expectAll("old\n");
    EXPECT_FALSE(fs::exists(repository_ / "n"));
}

/// libgit2 creates such a file again.
TEST_F(UnwritableFiles, ThatChangeTheirPermissionsInSuchAFolderAreRefused)
{
    makeBranch("topic", changesAll_ + makesExecutable("d/r"));
    giveToUnprivilegedUser(folder().path());
    repository_.setMode("d", 0555);
    const std::string text = switchByAnother();
    repository_.setMode("d", 0755);
    EXPECT_EQ(text, "the file 'd/r' changes its permissions, and its folder cannot be written to");
    expectAll("old\n");
    EXPECT_FALSE(fs::exists(repository_ / "n"));
}

/// libgit2 removes each file in conflict, and creates it again.
TEST_F(UnwritableFiles, InConflictInSuchAFolderAreRefused)
{
    diverge(writesEach({"a", "d/r"}, "ours\n"), changesAll_);
    expectMergeRefusedIn("d");
}

TEST_F(UnwritableFiles, InConflictInSuchAFolderAreRefusedIfTheyAreRenamed)
{
    const std::string lines = "1\n2\n3\n4\n5\n6\n7\n8\n";
    repository_.commitAll(writes("b", lines + "old\n"), "lines");
    diverge(writes("a", "ours\n") + removes("b") + writes("e/renamed", lines + "ours\n"),
            writes("a", "theirs\n") + writes("b", lines + "theirs\n"));
    expectMergeRefusedIn("e");
}

/// Ignored files may be overwritten, but not what else they are.
TEST_F(UnwritableFiles, OfOurOwnWhereTheirsIsInConflictAreRefused)
{
    repository_.write(".git/info/exclude", "i\n");
    repository_.write("i", "old\n");
    repository_.git({"add", "--force", "i"});
    repository_.commitAll("ignored");
    diverge(removes("i"), writes("i", "theirs\n"));
    repository_.write("../precious", "precious\n");
    fs::create_hard_link(repository_ / "../precious", repository_ / "i");
    expectMergeRefused(inTheWay("untracked file 'i'"));
    repository_.remove("i");
    repository_.write("i", "precious\n");
    repository_.setMode("i", 0444);
    const std::string text = unprivileged([this] { merge("topic"); });
    EXPECT_THAT(text, HasSubstr("the untracked file 'i' is in the way of the checkout"));
    EXPECT_EQ(repository_.read("i"), "precious\n");
    repository_.setMode("i", 0644);
    EXPECT_EQ(unprivileged([this] { expectConflicts("topic"); }), "");
    EXPECT_EQ(repository_.read("i"), "theirs\n");
}

TEST_F(UnwritableFiles, OfOurOwnWhereTheirsIsRenamedToAreRefused)
{
    repository_.write(".git/info/exclude", "i\n");
    repository_.write("../precious", "precious\n");
    diverge(removes("a"), moves("a", "i"));
    fs::create_hard_link(repository_ / "../precious", repository_ / "i");
    expectMergeRefused(inTheWay("untracked file 'i'"));
    EXPECT_EQ(repository_.read("../precious"), "precious\n");
}

/// Only the owner may remove another user's file from a folder like /tmp.
TEST_F(UnwritableFiles, OfAnotherUserInAFolderWithTheStickyBitAreRefused)
{
    if (!runsAsRoot())
    {
        return;
    }
    makeBranch("topic", changesAll_);
    giveToUnprivilegedUser(folder().path());
    ASSERT_EQ(::chown((repository_ / "d").c_str(), 0, 0), 0);
    ASSERT_EQ(::chown((repository_ / "d/r").c_str(), 0, 0), 0);
    repository_.setMode("d", 01777);
    const std::string text = switchByAnother();
    EXPECT_EQ(text, "the file 'd/r' cannot be written to, and its folder cannot be written to");
    EXPECT_EQ(repository_.read("a"), "old\n");
    EXPECT_EQ(repository_.read("d/r"), "old\n");
}

/// A program that lies in the working copy and runs.
class RunningProgram : public UnwritableFiles
{
  protected:
    RunningProgram()
    {
        fs::copy_file("/bin/sleep", repository_ / "program");
        repository_.commitAll("program");
        makeBranch("topic", changesAll_ + writes("program", "theirs\n"));
        start();
    }
    ~RunningProgram() override
    {
        if (process_ > 0)
        {
            ::kill(process_, SIGKILL);
            ::waitpid(process_, nullptr, 0);
        }
    }
    void start()
    {
        const std::string program = (repository_ / "program").string();
        int ends[2];
        ASSERT_EQ(::pipe2(ends, O_CLOEXEC), 0);
        process_ = ::fork();
        ASSERT_NE(process_, -1);
        if (process_ == 0)
        {
            ::execl(program.c_str(), program.c_str(), "600", nullptr);
            ::_exit(127);
        }
        ::close(ends[1]);
        char none = 0;
        // The end of the pipe comes when the program has begun.
        EXPECT_EQ(::read(ends[0], &none, 1), 0);
        ::close(ends[0]);
        ASSERT_EQ(::waitpid(process_, nullptr, WNOHANG), 0);
    }

  private:
    pid_t process_ = -1;
};

TEST_F(RunningProgram, IsMadeAnewByASwitch)
{
    branches().switchBranch("topic");
    expectAll("theirs\n");
    EXPECT_EQ(repository_.read("program"), "theirs\n");
    expectMode("program", 0755);
    EXPECT_TRUE(status().empty());
}

} // namespace
