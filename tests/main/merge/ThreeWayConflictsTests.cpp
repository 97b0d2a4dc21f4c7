// SPDX-License-Identifier: MIT
#include <string>
#include <vector>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "MergeFixture.hpp"
#include "support/Change.hpp"
#include "support/Scripts.hpp"
#include "support/Sentence.hpp"

namespace
{

using testing::HasSubstr;
using namespace vclink::test;

/// What each side does, what is in conflict then (stage and name), which names the working copy
/// has with which content, if given, and what is done and committed before.
struct ConflictingSides : Sentence
{
    Change ours;
    Change theirs;
    std::vector<std::string> conflicts;
    RepositoryState::Entries standing = {};
    Change before = {};
};

/// The conflicts of a merge, compared with what git makes of the same.
class ThreeWayConflicts : public MergeFixture
{
  protected:
    void make(const ConflictingSides &sides)
    {
        if (sides.before)
            sides.before(repository_);
        repository_.commitAll("before");
        diverge(sides.ours, sides.theirs);
    }
    void attribute(const std::string &line)
    {
        repository_.commitAll(writes(".gitattributes", line), "attributes");
        diverge(writes("file", "ours\n"), writes("file", "theirs\n"));
    }
    /// Expects markers, where git has this.
    void expectMarkersUnlikeGit(const std::string &contentOfGit) const
    {
        const auto byGit = outcomeByGit("topic");
        const auto outcome = outcomeByLibrary("topic");
        EXPECT_EQ(outcome.index, byGit.index);
        EXPECT_EQ(byGit.workingTree.at("file"), contentOfGit);
        EXPECT_THAT(outcome.workingTree.at("file"), HasSubstr("<<<<<<< \nours\n=======\n"));
    }
};

class ConflictsAsInGit : public ThreeWayConflicts,
                         public testing::WithParamInterface<ConflictingSides>
{
};

TEST_P(ConflictsAsInGit, AreThese)
{
    make(GetParam());
    expectConflictsAsGit(GetParam().conflicts);
    const auto standing = workingTreeOf(repository_);
    for (const auto &entry : GetParam().standing)
        EXPECT_THAT(standing, testing::Contains(entry));
}

const std::vector<std::string> threeStages{"1 file", "2 file", "3 file"};

const ConflictingSides conflictsAsInGit[]{
    {{"OfTheSameLines"}, writes("file", "ours\n"), writes("file", "theirs\n"), threeStages},
    {{"OfAFileThatBothAdded"},
     writes("new", "ours\n"),
     writes("new", "theirs\n"),
     {"2 new", "3 new"}},
    {{"OfAFileThatWeDeletedWithTheirsInItsPlace"},
     removes("file"),
     writes("file", "theirs\n"),
     {"1 file", "3 file"},
     {{"file", "644 theirs\n"}}},
    {{"OfAFileThatTheyDeletedWithOursInItsPlace"},
     writes("file", "ours\n"),
     removes("file"),
     {"1 file", "2 file"},
     {{"file", "644 ours\n"}}},
    {{"BesideCleanFilesWhichAreTaken"},
     writes("file", "ours\n") + writes("ours", "x"),
     writes("file", "theirs\n") + writes("theirs", "x"),
     threeStages,
     {{"theirs", "644 x"}}},
    {{"OfAFileThatBothSidesMadeBinaryWithOursInItsPlace"},
     writes("file", std::string("ours\0", 5)),
     writes("file", std::string("theirs\0", 7)),
     threeStages,
     {{"file", std::string("644 ours\0", 9)}}},
    {{"WithTheStyleOfThreeSides"},
     writes("file", "ours\n"),
     writes("file", "theirs\n"),
     threeStages,
     {},
     runsGit({"config", "merge.conflictStyle", "diff3"})},
    {{"OfSymbolicLinks"},
     links("ours", "link"),
     links("theirs", "link"),
     {"1 link", "2 link", "3 link"},
     {},
     links("file", "link")},
    {{"OfTwoNamesForOneFile"},
     moves("file", "ours"),
     moves("file", "theirs"),
     {"1 file", "2 ours", "3 theirs"}},
    {{"OfCaseOnlyRenamesOfBothSides"},
     moves("file", "File"),
     moves("file", "FILE"),
     {"3 FILE", "2 File", "1 file"}},
};

INSTANTIATE_TEST_SUITE_P(TheConflicts, ConflictsAsInGit, testing::ValuesIn(conflictsAsInGit),
                         testing::PrintToStringParamName());

TEST_F(ThreeWayConflicts, LabelTheirMarkersWithTheHeadAndTheId)
{
    repository_.git({"config", "merge.conflictStyle", "diff3"});
    diverge(writes("file", "ours\n"), writes("file", "theirs\n"));
    expectConflicts("topic");
    EXPECT_EQ(repository_.read("file"), "<<<<<<< HEAD\nours\n||||||| first\n1\n2\n3\n4\n5\n6\n7\n8"
                                        "\n9\n=======\ntheirs\n>>>>>>> " +
                                            idOf("topic") + '\n');
}

TEST_F(ThreeWayConflicts, OfCrissCrossHistoriesAreAsInGit)
{
    diverge(writes("other", "ours 1\n"), writes("file", "theirs 1\n"));
    crissCross(writes("file", "ours 2\n"), writes("file", "theirs 2\n"));
    expectConflictsAsGit(threeStages);
}

/// Which libgit2 sees otherwise than git; "~theirs" behind a name means the id of the branch.
class ConflictsUnlikeGit : public ThreeWayConflicts,
                           public testing::WithParamInterface<ConflictingSides>
{
};

TEST_P(ConflictsUnlikeGit, AreThese)
{
    make(GetParam());
    const auto byGit = outcomeByGit("topic");
    const auto outcome = outcomeByLibrary("topic");
    EXPECT_FALSE(outcome == byGit);
    EXPECT_EQ(conflicts(), GetParam().conflicts);
    EXPECT_EQ(status().empty(), GetParam().conflicts.empty());
    RepositoryState::Entries standing;
    for (const auto &[name, content] : workingTreeOf(repository_))
    {
        const auto at = name.find('~' + idOf("topic"));
        const std::string told = at == std::string::npos ? name : name.substr(0, at) + "~theirs";
        const auto expected = GetParam().standing.find(told);
        const bool isTold = expected != GetParam().standing.end() && !expected->second.empty();
        standing.emplace(told, isTold ? content : "");
    }
    EXPECT_EQ(standing, GetParam().standing);
}

const ConflictingSides conflictsUnlikeGit[]{
    // git puts our file beside the link.
    {{"OfAFileAndALink"},
     writes("file", "ours\n"),
     links("other", "file"),
     threeStages,
     {{"file", "644 ours\n"}, {"other", ""}}},
    {{"OfANewFileAndANewLink"},
     writes("new", "ours\n"),
     links("other", "new"),
     {"2 new", "3 new"},
     {{"file", ""}, {"new", "644 ours\n"}, {"other", ""}}},
    // git's index has the file under its new name, too.
    {{"OfAFileAndAFolder"},
     writes("new", "ours\n"),
     writes("new/inside", "theirs\n"),
     {"2 new"},
     {{"file", ""}, {"new", ""}, {"new/inside", ""}, {"new~HEAD", ""}, {"other", ""}}},
    {{"OfAFolderAndAFile"},
     writes("new/inside", "ours\n"),
     writes("new", "theirs\n"),
     {"3 new"},
     {{"file", ""}, {"new", ""}, {"new/inside", ""}, {"new~theirs", ""}, {"other", ""}}},
    // git has both stages under the new name.
    {{"OfARenameAndADeletion"},
     moves("file", "moved"),
     removes("file"),
     {"1 file", "2 moved"},
     {{"moved", ""}, {"other", ""}}},
    {{"OfADeletionAndARename"},
     removes("file"),
     moves("file", "moved"),
     {"1 file", "3 moved"},
     {{"moved", ""}, {"other", ""}}},
    // git writes both into one file, with markers.
    {{"OfTwoFilesRenamedToOneName"},
     moves("file", "moved"),
     moves("other", "moved"),
     {"1 file", "3 file", "2 moved", "3 moved", "1 other", "2 other"},
     {{"moved~HEAD", ""}, {"moved~theirs", ""}}},
    {{"OfARenameAndANewFileOfTheName"},
     moves("file", "moved"),
     writes("moved", "theirs\n"),
     {"1 file", "3 file", "2 moved", "3 moved"},
     {{"moved~HEAD", ""}, {"moved~theirs", ""}, {"other", ""}}},
    // For git a conflict; libgit2 takes the executable one.
    {{"OfNewFilesWithDifferentModes"},
     writes("new", "same\n"),
     writes("new", "same\n") + makesExecutable("new"),
     {},
     {{"file", ""}, {"new", "755 same\n"}, {"other", ""}}},
    // git suspects that the new file belongs into the renamed folder; libgit2 leaves it.
    {{"OfAFolderThatTheyRenamed"},
     writes("a/new", "x\n"),
     moves("a", "b"),
     {},
     {{"a", ""}, {"a/new", ""}, {"b", ""}, {"b/1", ""}, {"b/2", ""}, {"file", ""}, {"other", ""}},
     writes("a/1", "a\n1\n2\n3\n") + writes("a/2", "b\n1\n2\n3\n")},
};

INSTANTIATE_TEST_SUITE_P(TheConflicts, ConflictsUnlikeGit, testing::ValuesIn(conflictsUnlikeGit),
                         testing::PrintToStringParamName());

/// git keeps our file, as libgit2 does if it is no text besides.
TEST_F(ThreeWayConflicts, OfFilesThatAreMergedAsBinaryHaveMarkers)
{
    attribute("file merge=binary\n");
    expectMarkersUnlikeGit("644 ours\n");
}

/// libgit2 drops what the driver wrote; git keeps it.
TEST_F(ThreeWayConflicts, OfADriverThatAnswersConflictHaveMarkers)
{
    attribute("file merge=half\n");
    Scripts scripts(folder() / "tools");
    repository_.git(
        {"config", "merge.half.driver", scripts.shell("echo half >\"$1\"; exit 1") + " %A"});
    expectMarkersUnlikeGit("644 half\n");
}

/// What a user has, the reason of the refusal and whether libgit2 has noted HEAD by then.
struct WorkInTheWay : Sentence
{
    Change mine;
    Failure failure;
    bool isHeadNoted;
};

class RefusedThreeWayMerge : public MergeFixture, public testing::WithParamInterface<WorkInTheWay>
{
};

TEST_P(RefusedThreeWayMerge, AsInGitKeeps)
{
    diverge(writes("ours", "x"), writes("file", "theirs\n") + writes("new", "theirs\n"));
    GetParam().mine(repository_);
    EXPECT_FALSE(makeTwin().tryGit({"merge", "--quiet", "--no-edit", "topic"}).succeeded());
    auto expected = stateOf(repository_);
    const auto index = indexStampOf(repository_);
    EXPECT_EQ(failureOfMerge("topic"), textOf(GetParam().failure));
    if (GetParam().isHeadNoted)
        expected.underWay["ORIG_HEAD"] = idOf("HEAD") + '\n';
    EXPECT_EQ(stateOf(repository_), expected);
    EXPECT_EQ(indexStampOf(repository_), index);
}

const Failure overwritten{GIT_ECONFLICT, GIT_ERROR_MERGE,
                          "1 uncommitted change would be overwritten by merge"};
const WorkInTheWay worksInTheWay[]{
    {{"AnEditOfAFileThatItTouches"},
     writes("file", "mine\n"),
     {GIT_ECONFLICT, GIT_ERROR_CHECKOUT,
      "the uncommitted changes of 'file' would be lost in the merge"},
     false},
    {{"AStagedEditOfAFileThatItTouches"},
     writes("file", "mine\n") + runsGit({"add", "file"}),
     overwritten,
     true},
    {{"AStagedEditOfAnotherFile"},
     writes("other", "mine\n") + runsGit({"add", "other"}),
     overwritten,
     true},
    {{"AnUntrackedFileInTheWay"},
     writes("new", "mine\n"),
     {GIT_ECONFLICT, GIT_ERROR_CHECKOUT, "the untracked file 'new' is in the way of the checkout"},
     false},
};

INSTANTIATE_TEST_SUITE_P(ThreeWays, RefusedThreeWayMerge, testing::ValuesIn(worksInTheWay),
                         testing::PrintToStringParamName());

} // namespace
