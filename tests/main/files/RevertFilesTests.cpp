// SPDX-License-Identifier: MIT
#include <string>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "StagingFixture.hpp"

namespace
{

using shared_vclink::git::Conflicted;
using testing::ElementsAre;
using vclink::test::asPath;
using vclink::test::expectRefusal;
using vclink::test::GitRepository;
using vclink::test::NothingChanges;
using vclink::test::RepositoryState;
using vclink::test::stampOf;
using vclink::test::States;
using vclink::test::workingTreeOf;

class RevertFiles : public vclink::test::StagingFixture
{
};

TEST_F(RevertFiles, ThrowsAnEditAway)
{
    repository_.write("file", "edited\n");
    expectRevertsAsGit({"file"});
    EXPECT_EQ(repository_.read("file"), "content of file\n");
    EXPECT_THAT(status(), ElementsAre());
}

TEST_F(RevertFiles, ThrowsAStagedEditAway)
{
    repository_.write("file", "staged\n");
    repository_.add({"file"});
    expectRevertsAsGit({"file"});
    EXPECT_THAT(status(), ElementsAre());
}

TEST_F(RevertFiles, ThrowsAStagedEditAndTheEditOnTopOfItAway)
{
    repository_.write("file", "staged\n");
    repository_.add({"file"});
    repository_.write("file", "edited\n");
    expectRevertsAsGit({"file"});
    EXPECT_THAT(status(), ElementsAre());
}

TEST_F(RevertFiles, ThrowsAnEditOfTheSameLengthAway)
{
    repository_.write("file", "CONTENT OF FILE\n");
    expectRevertsAsGit({"file"});
    EXPECT_EQ(repository_.read("file"), "content of file\n");
}

TEST_F(RevertFiles, BringsBackAFileThatIsGoneFromDisk)
{
    repository_.remove("file");
    expectRevertsAsGit({"file"});
    EXPECT_EQ(repository_.read("file"), "content of file\n");
}

TEST_F(RevertFiles, BringsBackAFileWithTheFolderAboveIt)
{
    repository_.remove("sub");
    expectRevertsAsGit({"sub/inside"});
    EXPECT_EQ(repository_.read("sub/inside"), "content of sub/inside\n");
}

TEST_F(RevertFiles, BringsBackAFileWhoseDeletionIsStaged)
{
    repository_.git({"rm", "--quiet", "file"});
    expectRevertsAsGit({"file"});
    EXPECT_THAT(status(), ElementsAre());
}

TEST_F(RevertFiles, TracksAFileAgainThatWasTakenOutOfTheIndex)
{
    repository_.git({"rm", "--quiet", "--cached", "file"});
    repository_.write("file", "edited since\n");
    expectRevertsAsGit({"file"});
    EXPECT_EQ(repository_.read("file"), "content of file\n");
    EXPECT_THAT(status(), ElementsAre());
}

TEST_F(RevertFiles, TakesAnAddedFileOutOfTheIndexAndLeavesItOnDisk)
{
    repository_.write("new", "x");
    repository_.add({"new"});
    const auto before = stampOf(repository_ / "new");
    revert({"new"});
    EXPECT_EQ(stampOf(repository_ / "new"), before);
    EXPECT_EQ(states(repository_, {"new"}), (States{{"new", "Unversioned"}}));
    EXPECT_THAT(status(), ElementsAre("?? new"));
}

TEST_F(RevertFiles, LeavesAnUntrackedFileAlone)
{
    repository_.write("new", "x");
    repository_.write("file", "edited\n");
    const auto before = stampOf(repository_ / "new");
    revert({"new", "file"});
    EXPECT_EQ(stampOf(repository_ / "new"), before);
    EXPECT_THAT(status(), ElementsAre("?? new"));
}

TEST_F(RevertFiles, LeavesAnIgnoredFileAlone)
{
    repository_.write(".git/info/exclude", "*.o\n");
    repository_.write("a.o", "x");
    const auto before = stampOf(repository_ / "a.o");
    revert({"a.o"});
    EXPECT_EQ(stampOf(repository_ / "a.o"), before);
}

TEST_F(RevertFiles, DoesNotWriteAFileWithoutChanges)
{
    const auto before = stampOf(repository_ / "file");
    revert({"file"});
    EXPECT_EQ(stampOf(repository_ / "file"), before);
}

TEST_F(RevertFiles, LeavesAllOtherChanges)
{
    repository_.write("file", "edited\n");
    repository_.write("other", "staged\n");
    repository_.add({"other"});
    repository_.write("other", "edited\n");
    repository_.remove("sub/inside");
    repository_.write("added", "x");
    repository_.add({"added"});
    repository_.write("new", "x");
    expectRevertsAsGit({"file"});
    EXPECT_THAT(status(), ElementsAre("A  added", "MM other", " D sub/inside", "?? new"));
}

TEST_F(RevertFiles, RevertsSeveralFilesAtOnce)
{
    repository_.write("file", "edited\n");
    repository_.remove("sub/inside");
    repository_.git({"rm", "--quiet", "other"});
    expectRevertsAsGit({"sub/inside", "other", "file"});
    EXPECT_THAT(status(), ElementsAre());
}

TEST_F(RevertFiles, DoesNothingForAnEmptyList)
{
    repository_.write("file", "edited\n");
    const NothingChanges nothing(repository_);
    revert({});
    EXPECT_NO_THROW(makeAdapter(folder() / "missing")->revertFiles({}));
}

TEST_F(RevertFiles, TakesAnEmptyPathAndTheRootForNothing)
{
    repository_.write("file", "edited\n");
    repository_.write("other", "staged\n");
    repository_.add({"other"});
    const RepositoryState before = stateOf(repository_);
    const auto adapter = makeAdapter(repository_.path());
    adapter->revertFiles({upath()});
    adapter->revertFiles({asPath(repository_.path())});
    adapter->revertFiles({asPath(repository_ / "."), asPath("missing/relative"), asPath("/")});
    EXPECT_EQ(stateOf(repository_), before);
    adapter->revertFiles({upath(), asPath(repository_ / "file"), asPath(repository_.path())});
    EXPECT_THAT(status(), ElementsAre("M  other"));
}

TEST_F(RevertFiles, DoesNothingForANameThatDoesNotExist)
{
    repository_.write("file", "edited\n");
    const RepositoryState before = stateOf(repository_);
    revert({"missing", "file/below", "../outside"});
    EXPECT_EQ(stateOf(repository_), before);
}

TEST_F(RevertFiles, TakesAFolderForAllBelowIt)
{
    repository_.write("sub/deep/#b", "x");
    repository_.write("subway", "x");
    repository_.commitAll("second");
    for (const auto *name : {"sub/deep/#b", "sub/inside", "subway"})
        repository_.write(name, "edited\n");
    repository_.write("sub/new", "x");
    expectRevertsAsGit({"sub"});
    EXPECT_THAT(status(), ElementsAre(" M subway", "?? sub/new"));
}

TEST_F(RevertFiles, TakesAFolderThatIsGoneForAllThatWasBelowIt)
{
    repository_.remove("sub");
    expectRevertsAsGit({"sub"});
}

TEST_F(RevertFiles, TakesAFolderWithADangerousNameForItsOwnEntry)
{
    repository_.write("#dir/a", "x");
    repository_.write("dir /a", "x");
    repository_.commitAll("second");
    repository_.write("#dir/a", "edited");
    repository_.write("dir /a", "edited");
    repository_.write("file", "edited");
    const RepositoryState before = stateOf(repository_);
    revert({"#dir", "dir "});
    EXPECT_EQ(stateOf(repository_), before);
}

TEST_F(RevertFiles, WorksWithAHeadThatNamesNoBranch)
{
    repository_.git({"checkout", "--quiet", "--detach"});
    repository_.write("file", "edited\n");
    expectRevertsAsGit({"file"});
}

TEST_F(RevertFiles, GoesBackToTheCommitThatHeadNames)
{
    repository_.write("file", "second\n");
    repository_.commitAll("second");
    repository_.write("file", "edited\n");
    revert({"file"});
    EXPECT_EQ(repository_.read("file"), "second\n");
}

TEST_F(RevertFiles, WorksInALinkedWorktree)
{
    const std::string linked = folder() / "linked";
    repository_.git({"worktree", "add", "--quiet", linked});
    const GitRepository worktree(linked);
    worktree.write("file", "edited\n");
    const NothingChanges inTheMainOne(repository_);
    makeAdapter(linked)->revertFiles({asPath(worktree / "file")});
    EXPECT_EQ(worktree.read("file"), "content of file\n");
}

TEST_F(RevertFiles, TakesFilesOutOfTheIndexWhereThereIsNoCommit)
{
    const auto empty = makeRepository("empty");
    for (const auto *name : {"new", "edited", "left"})
        empty.write(name, "x");
    empty.add();
    empty.write("edited", "edited since");
    const auto before = workingTreeOf(empty);
    const auto adapter = makeAdapter(empty.path());
    adapter->revertFiles({asPath(empty / "new"), asPath(empty / "edited")});
    EXPECT_EQ(workingTreeOf(empty), before);
    EXPECT_EQ(empty.git({"status", "--porcelain"}), "A  left\n?? edited\n?? new\n");
}

/// A branch that was only named is as good as no commit.
TEST_F(RevertFiles, TakesFilesOutOfTheIndexWhereHeadNamesNothing)
{
    repository_.git({"checkout", "--quiet", "--orphan", "fresh"});
    repository_.write("file", "edited\n");
    const auto before = workingTreeOf(repository_);
    revert({"file"});
    EXPECT_EQ(workingTreeOf(repository_), before);
    EXPECT_THAT(status(), ElementsAre("A  other", "A  sub/inside", "?? file"));
}

TEST_F(RevertFiles, RefusesAFileInConflictAndRevertsNoOther)
{
    beginMerge({"conflicted"});
    repository_.write("file", "edited\n");
    repository_.write("other", "staged\n");
    repository_.add({"other"});
    const NothingChanges nothing(repository_);
    for (const auto &names : {std::vector<std::string>{"conflicted", "file", "other"},
                              std::vector<std::string>{"other", "file", "conflicted"}})
    {
        expectRefusal<Conflicted>(inRoot({"conflicted"}), [&] { revert(names); });
    }
    EXPECT_EQ(states(repository_, {"file"}), (States{{"file", "Modified"}}));
}

TEST_F(RevertFiles, ReportsTheFilesInConflictInTheOrderOfPaths)
{
    beginMerge({"a-b", "a.b", "a/x", "B"});
    const NothingChanges nothing(repository_);
    expectRefusal<Conflicted>(inRoot({"B", "a/x", "a-b", "a.b"}),
                              [this] {
                                  revert({"file", "a.b", "a-b", "a/x", "B", "./a.b"});
                              });
}

TEST_F(RevertFiles, RefusesAFolderWithAFileInConflict)
{
    beginMerge({"dir/conflicted"});
    const NothingChanges nothing(repository_);
    expectRefusal<Conflicted>(inRoot({"dir/conflicted"}), [this] { revert({"dir"}); });
}

TEST_F(RevertFiles, RefusesWithTheCataloguesText)
{
    beginMerge({"conflicted"});
    try
    {
        revert({"conflicted"});
        FAIL() << "no exception";
    }
    catch (const vclink::git::TagException<Conflicted> &exception)
    {
        EXPECT_EQ(exception.GetBaseMsgIDObj().getKey(), "Conflicted");
        EXPECT_EQ(vclink::test::asUtf8(exception.GetUnicodeMessageTxt()),
                  "Nothing was reverted, because these files have unresolved conflicts:\n" +
                      (repository_ / "conflicted").string());
    }
}

TEST_F(RevertFiles, RevertsOtherFilesDuringAMerge)
{
    beginMerge({"conflicted"});
    repository_.write("file", "edited\n");
    repository_.write("other", "staged\n");
    repository_.add({"other"});
    expectRevertsAsGit({"file", "other"});
    EXPECT_EQ(stateOf(repository_).underWay.count("MERGE_HEAD"), 1U);
    EXPECT_EQ(states(repository_, {"conflicted"}), (States{{"conflicted", "InConflict"}}));
}

} // namespace
