// SPDX-License-Identifier: MIT
// The ways of the buttons for branches.
#include <string>

#include <QStatusBar>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "DesktopFixture.hpp"
#include "support/Change.hpp"
#include "support/Scripts.hpp"
#include "text.hpp"

namespace
{

using namespace vclink::test;
using testing::HasSubstr;
using vclink::desktop::fromUtf8;
using vclink::desktop::toUtf8;

class BranchCommands : public DesktopFixture
{
  protected:
    BranchCommands()
    {
        repository_.write("a", "first\n");
        repository_.commitAll("first");
    }
    void choose(const std::string &command, const QStringList &values)
    {
        DesktopFixture::choose(command);
        fill(values);
        settle();
    }
    std::string head() const
    {
        return repository_.line({"symbolic-ref", "--short", "HEAD"});
    }
};

TEST_F(BranchCommands, NewBranchBeginsWhereItIsTold)
{
    repository_.makeBranch("topic", writes("b", "topic\n"));
    open();
    choose("newBranch", {"lake", "topic"});
    EXPECT_EQ(repository_.line({"rev-parse", "lake"}), repository_.line({"rev-parse", "topic"}));
    EXPECT_EQ(head(), "main");
}

TEST_F(BranchCommands, NewBranchBeginsAtTheLastCommitIfNothingElseIsChosen)
{
    open();
    choose("newBranch", {"lake"});
    EXPECT_EQ(repository_.line({"rev-parse", "lake"}), repository_.line({"rev-parse", "HEAD"}));
}

TEST_F(BranchCommands, DeleteTellsTheCommitForTheWayBack)
{
    repository_.makeBranch("topic", writes("b", "topic\n"));
    const std::string id = repository_.line({"rev-parse", "topic"});
    open();
    choose("deleteBranch", {"topic"});
    confirm();
    settle();
    EXPECT_EQ(repository_.git({"branch", "--list", "topic"}), "");
    EXPECT_THAT(toUtf8(window().statusBar()->currentMessage()), HasSubstr(id));
}

TEST_F(BranchCommands, SwitchChecksTheBranchOut)
{
    repository_.makeBranch("topic", writes("b", "topic\n"));
    open();
    EXPECT_EQ(find<QLabel>("branch").text(), "main");
    choose("switch", {"topic"});
    EXPECT_EQ(head(), "topic");
    EXPECT_EQ(repository_.read("b"), "topic\n");
    EXPECT_EQ(find<QLabel>("branch").text(), "topic");
}

TEST_F(BranchCommands, ARefusedSwitchIsToldAndLosesNothing)
{
    repository_.makeBranch("topic", writes("a", "topic\n"));
    open();
    repository_.write("a", "work\n");
    choose("switch", {"topic"});
    EXPECT_THAT(takeMessage(), HasSubstr("Git could not complete the operation"));
    EXPECT_EQ(repository_.read("a"), "work\n");
    EXPECT_EQ(head(), "main");
}

TEST_F(BranchCommands, MergeFastForwards)
{
    repository_.makeBranch("topic", writes("b", "topic\n"));
    open();
    choose("merge", {"topic"});
    EXPECT_EQ(repository_.line({"rev-parse", "HEAD"}), repository_.line({"rev-parse", "topic"}));
}

TEST_F(BranchCommands, MergeRunsADriver)
{
    Scripts scripts(folder() / "scripts");
    repository_.git({"config", "merge.join.driver",
                     scripts.shell("cat \"$1\" \"$2\" >\"$3\"; cp \"$3\" \"$1\"") + " %A %B " +
                         (folder() / "joined").string()});
    repository_.write(".gitattributes", "*.dat merge=join\n");
    repository_.write("x.dat", "first\n");
    repository_.commitAll("data");
    repository_.makeBranch("topic", writes("x.dat", "theirs\n"));
    repository_.write("x.dat", "ours\n");
    repository_.commitAll("ours");
    open();
    // A probe ends a guard, which takes the drivers away.
    window().open(upath(vclink::desktop::toUstring(fromUtf8(repository_.path().string()))));
    settle();
    choose("merge", {"topic"});
    EXPECT_EQ(repository_.read("x.dat"), "ours\ntheirs\n");
    EXPECT_EQ(status(), "");
}

TEST_F(BranchCommands, MergeRefusesUncommittedWorkAndSaysWhy)
{
    repository_.makeBranch("topic", writes("b", "topic\n"));
    repository_.write("c", "ours\n");
    repository_.commitAll("ours");
    open();
    repository_.write("a", "work\n");
    choose("merge", {"topic"});
    EXPECT_THAT(takeMessage(), HasSubstr("\"topic\" could not be merged"));
    EXPECT_EQ(repository_.read("a"), "work\n");
    EXPECT_EQ(window().conflicts(), nullptr);
}

} // namespace
