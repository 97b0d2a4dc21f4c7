// SPDX-License-Identifier: MIT
#include <ostream>
#include <string>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "StagingFixture.hpp"
#include "runScript.hpp"

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

/// What is done in a script of the shell, what is reverted, and git's status then.
struct RevertCase
{
    const char *sentence;
    const char *script;
    std::vector<std::string> names;
    std::vector<std::string> status{};
};

void PrintTo(const RevertCase &row, std::ostream *stream)
{
    *stream << row.script;
}

class RevertAsGit : public RevertFiles, public testing::WithParamInterface<RevertCase>
{
};

TEST_P(RevertAsGit, Reverts)
{
    vclink::test::runScript(repository_, GetParam().script);
    expectRevertsAsGit(GetParam().names);
    EXPECT_EQ(status(), GetParam().status);
}

const RevertCase revertCases[] = {
    {"AnEdit", "echo edited >file", {"file"}},
    {"AStagedEdit", "echo staged >file; git add file", {"file"}},
    {"AStagedEditAndTheEditOnTopOfIt",
     "echo staged >file; git add file; echo edited >file",
     {"file"}},
    {"AnEditOfTheSameLength", "echo CONTENT OF FILE >file", {"file"}},
    {"AFileThatIsGoneFromDisk", "rm file", {"file"}},
    {"AFileThatIsGoneWithTheFolderAboveIt", "rm -r sub", {"sub/inside"}},
    {"AFileWhoseDeletionIsStaged", "git rm --quiet file", {"file"}},
    {"AFileThatWasTakenOutOfTheIndex", "git rm --quiet --cached file; echo edited >file", {"file"}},
    {"SeveralFilesAtOnce",
     "echo edited >file; rm sub/inside; git rm --quiet other",
     {"sub/inside", "other", "file"}},
    {"NoOtherChanges",
     "echo edited >file; echo staged >other; git add other; echo edited >other; rm sub/inside; "
     "echo x >added; git add added; echo x >new",
     {"file"},
     {"A  added", "MM other", " D sub/inside", "?? new"}},
    {"AFolderThatIsGone", "rm -r sub", {"sub"}},
    {"WithAHeadThatNamesNoBranch", "git checkout --quiet --detach; echo edited >file", {"file"}},
};

INSTANTIATE_TEST_SUITE_P(It, RevertAsGit, testing::ValuesIn(revertCases),
                         [](const auto &row) { return row.param.sentence; });

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

TEST_F(RevertFiles, LeavesUntrackedIgnoredAndUnchangedFilesAlone)
{
    repository_.write(".git/info/exclude", "*.o\n");
    for (const auto *name : {"new", "a.o", "file"})
        repository_.write(name, "edited\n");
    const auto stamps = [this]
    {
        return std::vector{stampOf(repository_ / "new"), stampOf(repository_ / "a.o"),
                           stampOf(repository_ / "other")};
    };
    const auto before = stamps();
    revert({"new", "a.o", "other", "file"});
    EXPECT_EQ(stamps(), before);
    EXPECT_THAT(status(), ElementsAre("?? new"));
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

TEST_F(RevertFiles, ReportsTheFilesInConflictInTheOrderOfPathsAlsoOfAFolder)
{
    beginMerge({"a-b", "a.b", "a/x", "B"});
    const NothingChanges nothing(repository_);
    const std::vector<std::string> names{"file", "a.b", "a-b", "a/x", "B", "./a.b"};
    expectRefusal<Conflicted>(inRoot({"B", "a/x", "a-b", "a.b"}), [&] { revert(names); });
    expectRefusal<Conflicted>(inRoot({"a/x"}), [this] { revert({"a"}); });
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
