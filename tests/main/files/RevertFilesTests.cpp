// SPDX-License-Identifier: MIT
#include <string>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "StagingFixture.hpp"
#include "support/Change.hpp"
#include "support/Sentence.hpp"

namespace
{

using shared_vclink::git::Conflicted;
using testing::ElementsAre;
using namespace vclink::test;

using RevertFiles = StagingFixture;

/// What is changed, what is reverted and git's status then; what is done and committed before.
struct RevertRow : Sentence
{
    Change change;
    std::vector<std::string> names;
    std::vector<std::string> status = {};
    Change before = {};
};

class RevertedAsByGit : public RevertFiles, public testing::WithParamInterface<RevertRow>
{
};

TEST_P(RevertedAsByGit, Is)
{
    if (GetParam().before)
    {
        GetParam().before(repository_);
        repository_.commitAll("before");
    }
    GetParam().change(repository_);
    expectRevertsAsGit(GetParam().names);
    EXPECT_EQ(status(), GetParam().status);
}

Change stages(const std::string &name, const std::string &bytes)
{
    return writes(name, bytes) + runsGit({"add", name});
}

const RevertRow contentRows[]{
    {{"AnEdit"}, writes("file", "edited\n"), {"file"}},
    {{"AnEditOfTheSameLength"}, writes("file", "CONTENT OF FILE\n"), {"file"}},
    {{"AStagedEdit"}, stages("file", "staged\n"), {"file"}},
    {{"AStagedEditAndTheEditOnTopOfIt"},
     stages("file", "staged\n") + writes("file", "edited\n"),
     {"file"}},
    {{"AFileThatIsGoneFromDisk"}, removes("file"), {"file"}},
    {{"AFileThatIsGoneWithTheFolderAboveIt"}, removes("sub"), {"sub/inside"}},
    {{"AFolderThatIsGone"}, removes("sub"), {"sub"}},
    {{"AFileWhoseDeletionIsStaged"}, runsGit({"rm", "--quiet", "file"}), {"file"}},
    {{"AFileThatWasTakenOutOfTheIndex"},
     runsGit({"rm", "--quiet", "--cached", "file"}) + writes("file", "edited since\n"),
     {"file"}},
    {{"AFileAmongOtherChanges"},
     writes("file", "edited\n") + stages("other", "staged\n") + writes("other", "edited\n") +
         removes("sub/inside") + stages("added", "x") + writes("new", "x"),
     {"file"},
     {"A  added", "MM other", " D sub/inside", "?? new"}},
    {{"SeveralFilesAtOnce"},
     writes("file", "edited\n") + removes("sub/inside") + runsGit({"rm", "--quiet", "other"}),
     {"sub/inside", "other", "file"}},
    {{"AllBelowAFolder"},
     writes("sub/deep/#b", "edited\n") + writes("sub/inside", "edited\n") +
         writes("subway", "edited\n") + writes("sub/new", "x"),
     {"sub"},
     {" M subway", "?? sub/new"},
     writes("sub/deep/#b", "x") + writes("subway", "x")},
    {{"AnEditOnADetachedHead"},
     runsGit({"checkout", "--quiet", "--detach"}) + writes("file", "edited\n"),
     {"file"}},
    {{"AnEditOfTheSecondCommit"},
     writes("file", "edited\n"),
     {"file"},
     {},
     writes("file", "second\n")},
};

INSTANTIATE_TEST_SUITE_P(Content, RevertedAsByGit, testing::ValuesIn(contentRows),
                         testing::PrintToStringParamName());

const RevertRow kindRows[]{
    {{"AnExecutableBit"},
     [](const GitRepository &copy)
     {
         copy.setMode("tool", 0644);
         copy.setMode("file", 0755);
     },
     {"tool", "file"},
     {},
     writes("tool", "x") + makesExecutable("tool")},
    {{"AStagedExecutableBit"}, makesExecutable("file") + runsGit({"add", "file"}), {"file"}},
    {{"LineEndsAsTheAttributesSay"},
     writes("a.txt", "edited\n") + removes("a.bin"),
     {"a.txt", "a.bin"},
     {},
     writes(".gitattributes", "*.txt text eol=crlf\n*.bin -text\n") +
         writes("a.txt", "one\r\ntwo\r\n") + writes("a.bin", "one\r\ntwo\n")},
    {{"LinksThatAreGoneOrLeadNowhere"},
     removes("gone") + links("elsewhere", "dangling"),
     {"gone", "dangling"},
     {},
     links("file", "gone") + links("nowhere", "dangling")},
    {{"AFileOfALinkThatLeadsNowhere"}, links("nowhere", "file"), {"file"}},
    {{"AFileOfAFolder"}, removes("file") + writes("file/inside", "x"), {"file"}},
    {{"AStagedChangeOfAFileToALink"},
     links("nowhere", "file") + runsGit({"add", "file"}) + stages("other", "edited\n"),
     {"file", "other"}},
    {{"AStagedChangeOfALinkToAFile"},
     removes("link") + stages("link", "x"),
     {"link"},
     {},
     links("nowhere", "link")},
    {{"TheDeletionOfARenaming"}, moves("file", "renamed"), {"file"}, {"A  renamed"}},
    {{"AFileBesideEntriesWithFlags"},
     runsGit({"update-index", "--skip-worktree", "other"}) +
         runsGit({"update-index", "--assume-unchanged", "sub/inside"}) + removes("other") +
         writes("file", "edited\n"),
     {"file"}},
};

INSTANTIATE_TEST_SUITE_P(Kind, RevertedAsByGit, testing::ValuesIn(kindRows),
                         testing::PrintToStringParamName());

/// A folder is staged in the place of a file with the same content, which is not listed.
Change stagesFolderOfTwin(const Change &change)
{
    return change + [](const GitRepository &copy)
    {
        copy.git({"rm", "--quiet", "same-b"});
        copy.write("same-b/in", "x");
        copy.add({"same-b"});
    };
}

const Change makesTwins = writes("same-a", "same\n") + writes("same-b", "same\n");
const std::vector<std::string> statusOfTwins{"D  same-b", "A  same-b/in"};

const RevertRow twinRows[]{
    {{"Unchanged"},
     stagesFolderOfTwin(changesNothing),
     {"same-a", "sub/inside"},
     statusOfTwins,
     makesTwins},
    {{"Edited"},
     stagesFolderOfTwin(writes("same-a", "edited\n")),
     {"same-a", "sub/inside"},
     statusOfTwins,
     makesTwins},
    {{"StagedAsDeleted"},
     stagesFolderOfTwin(runsGit({"rm", "--quiet", "same-a"})),
     {"same-a", "sub/inside"},
     statusOfTwins,
     makesTwins},
};

INSTANTIATE_TEST_SUITE_P(TwinOfAStagedFolder, RevertedAsByGit, testing::ValuesIn(twinRows),
                         testing::PrintToStringParamName());

/// And does not write a file without changes.
TEST_F(RevertFiles, LeavesAddedUntrackedAndIgnoredFilesAlone)
{
    repository_.write(".git/info/exclude", "*.o\n");
    const std::vector<std::string> names{"added", "a.o", "new", "other"};
    for (const auto *name : {"added", "a.o", "new"})
        repository_.write(name, "x");
    repository_.add({"added"});
    repository_.write("file", "edited\n");
    std::vector<FileStamp> before;
    for (const auto &name : names)
        before.push_back(stampOf(repository_ / name));
    revert({"added", "a.o", "file", "new", "other"});
    for (std::size_t i = 0; i < names.size(); ++i)
        EXPECT_EQ(stampOf(repository_ / names[i]), before[i]) << names[i];
    EXPECT_EQ(states(repository_, {"added"}), (States{{"added", "Unversioned"}}));
    EXPECT_THAT(status(), ElementsAre("?? added", "?? new"));
}

TEST_F(RevertFiles, DoesNothingForAnEmptyList)
{
    repository_.write("file", "edited\n");
    const NothingChanges nothing(repository_);
    revert({});
    EXPECT_NO_THROW(makeAdapter(folder() / "missing")->revertFiles({}));
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

TEST_F(RevertFiles, ReportsTheFilesInConflictAlsoThoseOfAFolderInTheOrderOfPaths)
{
    beginMerge({"a-b", "a.b", "a/x", "B"});
    const NothingChanges nothing(repository_);
    expectRefusal<Conflicted>(inRoot({"a/x"}), [this] { revert({"a"}); });
    expectRefusal<Conflicted>(inRoot({"B", "a/x", "a-b", "a.b"}),
                              [this] {
                                  revert({"file", "a.b", "a-b", "a/x", "B", "./a.b"});
                              });
}

/// libgit2 gives no states then. The index knows the conflicts all the same.
TEST_F(RevertFiles, RefusesAFileInConflictWhereTheStatesCannotBeRead)
{
    GitRepository::init(repository_ / "Module").commit("first");
    repository_.write(".gitmodules", "[submodule \"m\"]\n\tpath = Module\n\turl = ../m\n");
    repository_.commitAll("submodule");
    beginMerge({"conflicted", "a/x"});
    repository_.write(".gitmodules", "<<<<<<< HEAD\n");
    repository_.write("conflicted", "half resolved\n");
    repository_.write("file", "edited\n");
    ASSERT_EQ(states(repository_, {"Module", "conflicted"}), States());
    const NothingChanges nothing(repository_);
    expectRefusal<Conflicted>(inRoot({"a/x", "conflicted"}),
                              [this] {
                                  revert({"file", "Module", "conflicted", "a"});
                              });
    expectRefusal<Conflicted>(inRoot({"a/x", "conflicted"}), [this] { revert({"*"}); });
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
        EXPECT_EQ(asUtf8(exception.GetUnicodeMessageTxt()),
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
