// SPDX-License-Identifier: MIT
// The ways of the buttons for files, each compared with what git says of it.
#include <filesystem>
#include <string>

#include <QDialogButtonBox>
#include <QPlainTextEdit>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "DesktopFixture.hpp"
#include "text.hpp"

namespace
{

using namespace vclink::test;
using testing::HasSubstr;
using vclink::desktop::FormDialog;
using vclink::desktop::toUtf8;

class FileCommands : public DesktopFixture
{
  protected:
    FileCommands()
    {
        for (const auto *name : {"a", "b", "folder/c"})
            repository_.write(name, "first\n");
        repository_.commitAll("first");
    }
    void revert(const std::vector<std::string> &names)
    {
        select(names);
        choose("revert");
        confirm();
        settle();
    }
};

TEST_F(FileCommands, AddStagesWhatIsSelected)
{
    repository_.write("new", "new\n");
    repository_.write("other", "new\n");
    open();
    select({"new"});
    choose("add");
    ASSERT_TRUE(becomes("new", "added"));
    EXPECT_EQ(status(), "A  new\n?? other");
}

TEST_F(FileCommands, AddRefusesANameThatMeansOtherFilesToo)
{
    repository_.write("n*", "new\n");
    repository_.write("new", "new\n");
    open();
    select({"n*"});
    choose("add");
    EXPECT_THAT(takeMessage(), HasSubstr("act on other files"));
    EXPECT_EQ(status(), "?? n*\n?? new");
}

TEST_F(FileCommands, FailuresAreShownWithTheirTextAndDetails)
{
    repository_.write("new", "new\n");
    open();
    select({"new"});
    repository_.add({"new"});
    choose("add");
    auto &box = shown<QMessageBox>();
    EXPECT_THAT(toUtf8(box.text()), HasSubstr("new"));
    EXPECT_THAT(toUtf8(box.detailedText()), HasSubstr("shared_vclink:git:AlreadyAdded"));
    EXPECT_THAT(toUtf8(box.detailedText()), HasSubstr((repository_ / "new").string()));
}

TEST_F(FileCommands, ALockedIndexIsToldAsWorkOfAnotherProgram)
{
    repository_.write("new", "new\n");
    open();
    repository_.write(".git/index.lock", "");
    select({"new"});
    choose("add");
    EXPECT_THAT(toUtf8(shown<QMessageBox>().informativeText()), HasSubstr("Try again"));
}

TEST_F(FileCommands, RemoveEndsTheTrackingAndKeepsTheFile)
{
    open();
    find<QComboBox>("shown").setCurrentIndex(1);
    select({"a"});
    choose("remove");
    settle();
    EXPECT_EQ(status(), "D  a\n?? a");
}

TEST_F(FileCommands, RevertAsksFirst)
{
    repository_.write("a", "second\n");
    open();
    select({"a"});
    choose("revert");
    auto &box = shown<QMessageBox>();
    EXPECT_THAT(toUtf8(box.text()), HasSubstr("a"));
    box.button(QMessageBox::Cancel)->click();
    settle();
    EXPECT_EQ(repository_.read("a"), "second\n");
}

TEST_F(FileCommands, RevertHasAWayBack)
{
    repository_.write("a", "second\n");
    repository_.write("folder/c", "second\n");
    repository_.write("new", "new\n");
    repository_.add({"new", "a"});
    open();
    revert({"a", "folder/c", "new"});
    EXPECT_EQ(status(), "?? new");
    choose("undo");
    settle();
    EXPECT_EQ(status(), " M a\n M folder/c\nA  new");
    EXPECT_EQ(repository_.read("a"), "second\n");
    EXPECT_FALSE(find<QAction>("undo").isEnabled());
}

TEST_F(FileCommands, TheWayBackLeavesLaterWorkAlone)
{
    repository_.write("a", "second\n");
    repository_.write("b", "second\n");
    open();
    revert({"a", "b"});
    repository_.write("a", "third\n");
    choose("undo");
    EXPECT_THAT(takeMessage(), HasSubstr("left alone:\na"));
    EXPECT_EQ(repository_.read("a"), "third\n");
    EXPECT_EQ(repository_.read("b"), "second\n");
}

TEST_F(FileCommands, TheWayBackHasTheFolderThatWasInAFilesPlace)
{
    repository_.remove("a");
    repository_.write("a/work", "work\n");
    open();
    revert({"a"});
    EXPECT_EQ(repository_.read("a"), "first\n");
    choose("undo");
    settle();
    EXPECT_EQ(repository_.read("a/work"), "work\n");
}

TEST_F(FileCommands, RevertIsRefusedIfNoCopyCanBeKept)
{
    repository_.write("a", "second\n");
    // Where the copies would go.
    repository_.write("../home/.local/share", "no folder\n");
    open();
    select({"a"});
    choose("revert");
    confirm();
    takeMessage();
    EXPECT_EQ(repository_.read("a"), "second\n");
}

TEST_F(FileCommands, NothingIsRevertedOrCommittedIfTheStatesCannotBeRead)
{
    repository_.write("a", "second\n");
    open();
    select({"a"});
    // libgit2 looks a submodule up for each folder that the index has as one.
    repository_.git({"update-index", "--add", "--cacheinfo",
                     "160000," + repository_.line({"rev-parse", "HEAD"}) + ",s"});
    repository_.makeFolder("s");
    repository_.write(".gitmodules", "[submodule\n");
    choose("revert");
    confirm();
    EXPECT_EQ(takeMessage(), "The states of the files cannot be read.");
    EXPECT_EQ(repository_.read("a"), "second\n");
    choose("commit");
    EXPECT_EQ(takeMessage(), "The states of the files cannot be read.");
}

TEST_F(FileCommands, CommitShowsTheIdentityAndTakesEveryChange)
{
    repository_.write("a", "second\n");
    open();
    choose("commit");
    auto &form = shown<FormDialog>();
    std::string remarks;
    for (const auto *label : form.findChildren<QLabel *>())
        remarks += toUtf8(label->text()) + '\n';
    EXPECT_THAT(remarks, HasSubstr("Ada <ada@example.org>\n"));
    EXPECT_THAT(remarks, HasSubstr("\na\n"));
    EXPECT_FALSE(form.findChild<QDialogButtonBox *>()->button(QDialogButtonBox::Ok)->isEnabled());
    fill({"Second"});
    settle();
    EXPECT_EQ(repository_.line({"log", "-1", "--format=%an <%ae> %s"}),
              "Ada <ada@example.org> Second");
    EXPECT_EQ(status(), "");
}

TEST_F(FileCommands, CommitSaysWhenThereIsNothing)
{
    open();
    choose("commit");
    EXPECT_EQ(takeMessage(), "There is nothing to commit.");
}

TEST_F(FileCommands, CommitDoesNotCutABisectionOrASeriesShort)
{
    repository_.write("a", "second\n");
    repository_.git({"bisect", "start"});
    open();
    choose("commit");
    EXPECT_THAT(takeMessage(), HasSubstr("(Bisecting)"));
    repository_.git({"bisect", "reset"});
    repository_.makeFolder(".git/sequencer");
    settle();
    ASSERT_TRUE(waitFor([this] { return window().snapshot().repositoryState == "Normal"; }));
    choose("commit");
    EXPECT_THAT(takeMessage(), HasSubstr("Finish it with git first."));
}

} // namespace
