// SPDX-License-Identifier: MIT
#include <chrono>
#include <filesystem>
#include <memory>
#include <string>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "MergeFixture.hpp"
#include "main/TestOptionsFactory.hpp"
#include "support/Change.hpp"
#include "support/Sentence.hpp"
#include "support/text.hpp"

namespace
{

namespace git = vclink::git;
using testing::ElementsAre;
using namespace vclink::test;

/// A merge of diverged branches without conflicts, compared with what git makes of the same.
using ThreeWayMerge = MergeFixture;

/// What each side does, what the working copy holds then ("" for nothing), and what is done and
/// committed before.
struct CleanSides : Sentence
{
    Change ours;
    Change theirs;
    RepositoryState::Entries standing = {};
    Change before = {};
};

class CleanMerge : public ThreeWayMerge, public testing::WithParamInterface<CleanSides>
{
};

TEST_P(CleanMerge, IsAsInGit)
{
    const CleanSides &sides = GetParam();
    if (sides.before)
        sides.before(repository_);
    repository_.commitAll("before");
    diverge(sides.ours, sides.theirs);
    expectCleanAsGit();
    auto standing = workingTreeOf(repository_);
    for (const auto &[name, content] : sides.standing)
        EXPECT_EQ(standing[name], content) << name;
}

const Change firstLine = writes("file", "ours\n2\n3\n4\n5\n6\n7\n8\n9\n");
const Change lastLine = writes("file", "1\n2\n3\n4\n5\n6\n7\n8\ntheirs\n");
const std::string bothLines = "644 ours\n2\n3\n4\n5\n6\n7\n8\ntheirs\n";
const Change oursIsNew = writes("ours", "x");
const Change theirsIsNew = writes("theirs", "x");

const CleanSides cleanSides[]{
    {{"OfSeparateFilesHasBoth"}, oursIsNew, theirsIsNew},
    {{"OfSeparateLinesOfAFileHasBoth"}, firstLine, lastLine, {{"file", bothLines}}},
    {{"OfTheSameChangeHasItOnce"},
     writes("file", "same\n") + oursIsNew,
     writes("file", "same\n") + theirsIsNew},
    {{"OfADeletionKeepsTheFileDeleted"}, removes("other"), theirsIsNew, {{"other", ""}}},
    {{"OfTheirDeletionDeletesTheFile"}, oursIsNew, removes("other"), {{"other", ""}}},
    {{"OfAModeAndAContentHasBoth"},
     makesExecutable("file"),
     lastLine,
     {{"file", "755 1\n2\n3\n4\n5\n6\n7\n8\ntheirs\n"}}},
    {{"OfTheirModeTakesIt"}, oursIsNew, makesExecutable("other"), {{"other", "755 other\n"}}},
    {{"OfTheSameModeTakesIt"},
     makesExecutable("file") + oursIsNew,
     makesExecutable("file") + theirsIsNew},
    {{"OfARenameTakesTheOtherSidesChangeAlong"},
     moves("file", "moved"),
     lastLine,
     {{"moved", "644 1\n2\n3\n4\n5\n6\n7\n8\ntheirs\n"}}},
    {{"OfTheirRenameTakesOurChangeAlong"}, firstLine, moves("file", "moved"), {{"file", ""}}},
    {{"OfTheSameRenameOnBothSidesTakesIt"},
     moves("file", "moved") + oursIsNew,
     moves("file", "moved") + theirsIsNew},
    {{"OfRenamesOfDifferentFilesHasBoth"}, moves("file", "ours"), moves("other", "theirs")},
    {{"OfACaseOnlyRenameTakesIt"},
     writes("other", "ours\n"),
     moves("file", "FILE"),
     {{"file", ""}, {"FILE", "644 1\n2\n3\n4\n5\n6\n7\n8\n9\n"}}},
    {{"OfACaseOnlyRenameTakesOurChangeAlong"}, firstLine, moves("file", "FILE")},
    {{"OfSymbolicLinksOfOneSideTakesThem"},
     oursIsNew,
     links("file", "link"),
     {{"link", "link to file"}}},
    {{"OfFileModesThatGitIgnoresHasTheContent"},
     oursIsNew,
     lastLine,
     {},
     runsGit({"config", "core.fileMode", "false"})},
    {{"WithTheUnionAttributeHasBothLines"},
     writes("file", "ours\n"),
     writes("file", "theirs\n"),
     {{"file", "644 ours\ntheirs\n"}},
     writes(".gitattributes", "file merge=union\n")},
    {{"WithLineEndsThatAreConvertedHasBothLines"},
     writes("file", "ours\r\n2\r\n3\r\n4\r\n5\r\n6\r\n7\r\n8\r\n9\r\n"),
     writes("file", "1\r\n2\r\n3\r\n4\r\n5\r\n6\r\n7\r\n8\r\ntheirs\r\n"),
     {{"file", "644 ours\r\n2\r\n3\r\n4\r\n5\r\n6\r\n7\r\n8\r\ntheirs\r\n"}},
     writes(".gitattributes", "file text eol=crlf\n") + runsGit({"add", ".gitattributes"}) +
         runsGit({"-c", "user.name=x", "-c", "user.email=x", "commit", "--quiet", "-mx"}) +
         runsGit({"rm", "--quiet", "--cached", "file"}) + runsGit({"reset", "--quiet", "--hard"})},
};

INSTANTIATE_TEST_SUITE_P(TheMerge, CleanMerge, testing::ValuesIn(cleanSides),
                         testing::PrintToStringParamName());

/// libgit2 leaves both versions beside each other; git merges them.
TEST_F(ThreeWayMerge, OfTheSameRenameWithDifferentChangesIsAConflict)
{
    diverge(firstLine + moves("file", "moved"), lastLine + moves("file", "moved"));
    EXPECT_TRUE(makeTwin().tryGit({"merge", "--quiet", "--no-edit", "topic"}).succeeded());
    expectConflicts("topic");
    EXPECT_THAT(conflicts(), ElementsAre("1 file", "2 moved", "3 moved"));
    EXPECT_EQ(repository_.read("moved~HEAD"), "ours\n2\n3\n4\n5\n6\n7\n8\n9\n");
    EXPECT_EQ(repository_.read("moved~" + idOf("topic")), "1\n2\n3\n4\n5\n6\n7\n8\ntheirs\n");
    EXPECT_FALSE(std::filesystem::exists(repository_ / "moved"));
}

TEST_F(ThreeWayMerge, OfCrissCrossHistoriesIsAsInGit)
{
    makeDiverged();
    crissCross(writes("file", "ours\n2\n3\n4\n5\n6\n7\n8\n9\n"),
               writes("file", "1\n2\n3\n4\n5\n6\n7\n8\ntheirs\n"));
    expectCleanAsGit();
}

TEST_F(ThreeWayMerge, OfCrissCrossHistoriesCanTakeNothingOfTheirs)
{
    makeDiverged();
    const auto change = writes("file", "the same\n");
    crissCross(change + removes("ours") + removes("theirs"), change);
    expectCleanAsGit();
}

TEST_F(ThreeWayMerge, OfAChangedTypeWhereOursIsRenamedIsCommitted)
{
    diverge(moves("file", "renamed"), removes("file") + links("other", "file"));
    EXPECT_NO_THROW(merge("topic"));
    EXPECT_EQ(parents().size(), 2U);
    EXPECT_TRUE(status().empty());
}

TEST_F(ThreeWayMerge, WithAnOctopusAmongTheAncestorsIsAsInGitAndOfItsBranchesDoesNothing)
{
    for (const std::string name : {"one", "two", "three"})
        makeBranch(name, writes(name, name));
    repository_.git({"merge", "--quiet", "--no-edit", "one", "two", "three"});
    ASSERT_EQ(parents().size(), 3U);
    for (const auto *name : {"one", "two", "three"})
    {
        const NothingChanges nothing(repository_);
        EXPECT_NO_THROW(merge(name));
    }
    diverge(firstLine, lastLine);
    expectCleanAsGit();
}

TEST_F(ThreeWayMerge, ShowsItsProgress)
{
    makeDiverged();
    merge("topic");
    EXPECT_THAT(interactor_->progress.calls,
                ElementsAre(ProgressCall(0.0), ProgressCall(1.0),
                            ProgressCall(ustring(u"Checking out theirs"))));
}

/// libgit2 would store `$Id$x`, because it has replaced the word by an id as it wrote the file.
TEST_F(ThreeWayMerge, StoresWordsThatBeginLikeAnId)
{
    const std::string words = "$Idle = $x;\n$Id: one\ntwo$\n";
    repository_.commitAll(
        [&](const GitRepository &copy)
        {
            copy.write(".gitattributes", "* ident\n");
            copy.write("file", words);
        },
        "words");
    makeBranch("topic", writes("file", words + "theirs\n"));
    repository_.commitAll(writes("ours", "x"), "on main");
    // libgit2 takes a file that is as old as the index for changed.
    const auto past = std::filesystem::file_time_type::clock::now() - std::chrono::hours(1);
    std::filesystem::last_write_time(repository_ / "file", past);
    repository_.git({"update-index", "--refresh"});
    const MergeOutcome expected = outcomeByGit("topic");
    EXPECT_EQ(outcomeByLibrary("topic").tree, expected.tree);
    EXPECT_EQ(repository_.git({"show", "HEAD:file"}), words + "theirs\n");
}

/// Whatever the host's factory gives, and also files that it does not touch. Changed files make it
/// fail; see the tests of what is in the way of a merge.
TEST_F(ThreeWayMerge, PutsBackMissingFiles)
{
    makeDiverged();
    repository_.remove("file");
    repository_.write("untracked", "mine\n");
    git::GitAdapter adapter(asPath(repository_.path()),
                            std::make_shared<TestOptionsFactory>(interactor_));
    git::BranchManager::create(adapter)->merge("topic");
    EXPECT_TRUE(std::filesystem::exists(repository_ / "file"));
    EXPECT_EQ(repository_.read("untracked"), "mine\n");
    EXPECT_THAT(status(), ElementsAre("?? untracked"));
}

} // namespace
