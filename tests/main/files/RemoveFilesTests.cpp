// SPDX-License-Identifier: MIT
#include <functional>
#include <ostream>
#include <string>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "StagingFixture.hpp"
#include "runScript.hpp"

namespace
{

using shared_vclink::git::NoFilesToRemove;
using testing::ElementsAre;
using vclink::git::TagException;
using namespace vclink::test;

class RemoveFiles : public StagingFixture
{
  protected:
    void expectRefuses(const std::vector<std::string> &names) const
    {
        expectRefusal<NoFilesToRemove>({}, [&] { remove(names); });
    }
};

TEST_F(RemoveFiles, EndsTheTrackingOfAFileAndLeavesItOnDisk)
{
    remove({"file"});
    EXPECT_THAT(status(), ElementsAre("D  file", "?? file"));
    EXPECT_EQ(repository_.read("file"), "content of file\n");
    EXPECT_EQ(states(repository_, {"file"}), (States{{"file", "Deleted"}}));
}

/// What is done in a script of the shell, and what is removed as `git rm -r --cached` does.
struct RemovalCase
{
    const char *sentence;
    const char *script;
    std::vector<std::string> names;
    /// what stays in the index
    std::vector<std::string> left;
};

void PrintTo(const RemovalCase &row, std::ostream *stream)
{
    *stream << row.script;
}

class RemoveAsGit : public RemoveFiles, public testing::WithParamInterface<RemovalCase>
{
};

TEST_P(RemoveAsGit, Removes)
{
    runScript(repository_, GetParam().script);
    std::vector<std::string> command{"rm", "-r", "--quiet", "--cached", "--"};
    command.insert(command.end(), GetParam().names.begin(), GetParam().names.end());
    const RepositoryState expected = stateAfterGit({command});
    remove(GetParam().names);
    EXPECT_EQ(stateOf(repository_), expected);
    for (const auto &name : GetParam().left)
        EXPECT_EQ(expected.index.count(name), 1U) << name;
}

const RemovalCase removalCases[] = {
    {"SeveralFiles", ":", {"sub/inside", "file"}, {"other"}},
    {"ATrackedFileThatIsIgnoredToo", "echo file >.gitignore", {"file"}, {"other"}},
    {"AllBelowAFolder",
     "mkdir sub/deep; echo x | tee 'sub/deep/#b' subway >sub/new; git add subway sub/deep",
     {"sub"},
     {"subway"}},
    {"AllThatWasBelowAFolderThatIsGone", "rm -r sub", {"sub"}, {"file"}},
    {"TheOneFileThatLooksLikeAComment", "echo x >'#notes#'; git add .", {"#notes#"}, {"file"}},
    {"TheTwoFilesOfAListThatBeginDangerously",
     "for name in '#a' '!b' a b; do echo x >\"$name\"; done; git add .",
     {"#a", "!b"},
     {"a", "b"}},
    {"ALinkThatLeadsNowhere", "ln -s nowhere link; git add .", {"link"}, {"file"}},
    {"TheFileWhereAFolderStandsNow",
     "rm file; mkdir file; echo x >file/inside",
     {"file"},
     {"other"}},
};

INSTANTIATE_TEST_SUITE_P(It, RemoveAsGit, testing::ValuesIn(removalCases),
                         [](const auto &row) { return row.param.sentence; });

TEST_F(RemoveFiles, DoesNotWriteTheFileAndRefusesToRemoveItASecondTime)
{
    const auto before = stampOf(repository_ / "file");
    remove({"file"});
    EXPECT_EQ(stampOf(repository_ / "file"), before);
    const NothingChanges nothing(repository_);
    expectRefuses({"file"});
}

TEST_F(RemoveFiles, RefusesAnEmptyListAndOpensNothingForIt)
{
    const NothingChanges nothing(repository_);
    expectRefuses({});
    const auto adapter = makeAdapter(folder() / "missing");
    expectRefusal<NoFilesToRemove>({}, [&] { adapter->removeFiles({}); });
}

TEST_F(RemoveFiles, RefusesAListOfWhichNothingMatchesOrIsStillTracked)
{
    repository_.write(".git/info/exclude", "*.o\n");
    repository_.write("a.o", "x");
    repository_.git({"rm", "--quiet", "file"});
    remove({"other"});
    const NothingChanges nothing(repository_);
    expectRefuses({"missing", "file/below", "a.o", "../outside"});
    expectRefuses({"other", "file"});
}

TEST_F(RemoveFiles, PassesOverADeletedFileWithoutAWord)
{
    repository_.git({"rm", "--quiet", "--cached", "other"});
    remove({"other", "file"});
    EXPECT_THAT(status(), ElementsAre("D  file", "D  other", "?? file", "?? other"));
}

TEST_F(RemoveFiles, LeavesAnUnversionedFileAsItIsAndRemovesTheOthers)
{
    repository_.write("new", "x");
    const RepositoryState before = stateOf(repository_);
    EXPECT_NO_THROW(remove({"new"}));
    EXPECT_EQ(stateOf(repository_), before);
    EXPECT_EQ(states(repository_, {"new"}), (States{{"new", "Unversioned"}}));
    remove({"new", "file"});
    EXPECT_THAT(status(), ElementsAre("D  file", "?? file", "?? new"));
}

TEST_F(RemoveFiles, RemovesAFileInAnyStateButDeleted)
{
    repository_.commitAll(writes("gone", "x") + writes("staged", "x"), "second");
    repository_.write("file", "edited");
    repository_.write("staged", "edited");
    repository_.write("added", "x");
    repository_.add({"added", "staged"});
    repository_.write("intended", "x");
    repository_.git({"add", "--intent-to-add", "intended"});
    repository_.remove("gone");
    repository_.remove("sub/inside");
    repository_.symlink("nowhere", "sub/inside");
    const std::vector<std::string> names{"added", "file",   "gone",      "intended",
                                         "other", "staged", "sub/inside"};
    EXPECT_EQ(states(repository_, names), (States{{"added", "Added"},
                                                  {"file", "Modified"},
                                                  {"gone", "Missing"},
                                                  {"intended", "Added"},
                                                  {"other", "Clean"},
                                                  {"staged", "Modified"},
                                                  {"sub/inside", "Unknown"}}));
    const RepositoryState before = stateOf(repository_);
    remove(names);
    EXPECT_TRUE(indexOf(repository_).empty());
    EXPECT_EQ(states(repository_, {"added"}), (States{{"added", "Unversioned"}}));
    EXPECT_EQ(workingTreeOf(repository_), before.workingTree);
}

TEST_F(RemoveFiles, TakesAFileInConflictOutOfTheIndex)
{
    beginMerge({"conflicted", "left"});
    const RepositoryState expected = stateAfterGit({{"rm", "--cached", "conflicted"}});
    remove({"conflicted"});
    EXPECT_EQ(stateOf(repository_), expected);
}

TEST_F(RemoveFiles, WorksInARepositoryWithoutACommit)
{
    const auto empty = makeRepository("empty");
    empty.write("new", "x");
    empty.add({"new"});
    makeAdapter(empty.path())->removeFiles({asPath(empty / "new")});
    EXPECT_EQ(empty.git({"status", "--porcelain"}), "?? new\n");
}

TEST_F(RemoveFiles, TakesALinkForItsTarget)
{
    repository_.commitAll(links("file", "link"), "second");
    remove({"link"});
    EXPECT_THAT(status(), ElementsAre("D  file", "?? file"));
}

/// The files in the folder are looked up by name again.
TEST_F(RemoveFiles, TakesALinkAmongTheFilesOfAFolderForItsTarget)
{
    repository_.commitAll(links("../file", "sub/link"), "second");
    remove({"sub"});
    EXPECT_THAT(status(), ElementsAre("D  file", "D  sub/inside", "?? file", "?? sub/inside"));
}

TEST_F(RemoveFiles, TakesTheFilesOfAFolderWhereAFileStandsNow)
{
    repository_.remove("sub");
    repository_.write("sub", "x");
    remove({"sub"});
    EXPECT_THAT(status(), ElementsAre("D  sub/inside", "?? sub"));
}

TEST_F(RemoveFiles, RemovesASubmoduleAndLeavesItsFiles)
{
    addModule();
    const RepositoryState expected = stateAfterGit({{"rm", "--cached", "module"}});
    remove({"module"});
    EXPECT_EQ(indexOf(repository_), expected.index);
    EXPECT_EQ(repository_.read("module/file"), "x");
}

/// If both names of a renaming are listed, only the old path is reported, which the index does not
/// have.
TEST_F(RemoveFiles, DoesNothingForBothPathsOfAStagedRenaming)
{
    repository_.git({"mv", "file", "renamed"});
    const RepositoryState before = stateOf(repository_);
    EXPECT_NO_THROW(remove({"file", "renamed"}));
    EXPECT_EQ(stateOf(repository_), before);
    remove({"renamed"});
    EXPECT_THAT(status(), ElementsAre("D  file", "?? renamed"));
}

} // namespace
