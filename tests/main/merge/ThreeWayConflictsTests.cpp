// SPDX-License-Identifier: MIT
#include <filesystem>
#include <string>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "MergeFixture.hpp"

namespace
{

using vclink::test::Failure;
using vclink::test::stateOf;
using vclink::test::textOf;

/// The conflicts of a merge, compared with what git makes of the same.
class ThreeWayConflicts : public vclink::test::MergeFixture
{
};

TEST_F(ThreeWayConflicts, OfTheSameLinesLeavesMarkers)
{
    diverge(writing("file", "ours\n"), writing("file", "theirs\n"));
    expectConflictsAsGit({"1 file", "2 file", "3 file"});
}

TEST_F(ThreeWayConflicts, LabelsItsMarkersWithTheHeadAndTheId)
{
    diverge(writing("file", "ours\n"), writing("file", "theirs\n"));
    expectConflicts("topic");
    EXPECT_EQ(repository_.read("file"),
              "<<<<<<< HEAD\nours\n=======\ntheirs\n>>>>>>> " + idOf("topic") + '\n');
}

TEST_F(ThreeWayConflicts, OfAFileThatBothAddedLeavesMarkers)
{
    diverge(writing("new", "ours\n"), writing("new", "theirs\n"));
    expectConflictsAsGit({"2 new", "3 new"});
}

TEST_F(ThreeWayConflicts, OfAFileThatWeDeletedLeavesTheirs)
{
    diverge([this] { repository_.remove("file"); }, writing("file", "theirs\n"));
    expectConflictsAsGit({"1 file", "3 file"});
    EXPECT_EQ(repository_.read("file"), "theirs\n");
}

TEST_F(ThreeWayConflicts, OfAFileThatTheyDeletedLeavesOurs)
{
    diverge(writing("file", "ours\n"), [this] { repository_.remove("file"); });
    expectConflictsAsGit({"1 file", "2 file"});
    EXPECT_EQ(repository_.read("file"), "ours\n");
}

TEST_F(ThreeWayConflicts, OfCleanAndConflictingFilesTakesTheCleanOnes)
{
    diverge(
        [this]
        {
            repository_.write("file", "ours\n");
            repository_.write("ours", "x");
        },
        [this]
        {
            repository_.write("file", "theirs\n");
            repository_.write("theirs", "x");
        });
    expectConflictsAsGit({"1 file", "2 file", "3 file"});
    EXPECT_TRUE(std::filesystem::exists(repository_ / "theirs"));
}

TEST_F(ThreeWayConflicts, OfAFileThatBothSidesMadeBinaryLeavesOurs)
{
    diverge(writing("file", std::string("ours\0", 5)), writing("file", std::string("theirs\0", 7)));
    expectConflictsAsGit({"1 file", "2 file", "3 file"});
    EXPECT_EQ(repository_.read("file"), std::string("ours\0", 5));
}

TEST_F(ThreeWayConflicts, WithTheStyleOfThreeSidesIsAsInGit)
{
    repository_.git({"config", "merge.conflictStyle", "diff3"});
    diverge(writing("file", "ours\n"), writing("file", "theirs\n"));
    expectConflictsAsGit({"1 file", "2 file", "3 file"});
    EXPECT_THAT(repository_.read("file"), testing::HasSubstr("\n||||||| first\n1\n2\n"));
}

class RefusedThreeWayMerge : public vclink::test::MergeFixture
{
  protected:
    RefusedThreeWayMerge()
    {
        diverge(writing("ours", "x"),
                [this]
                {
                    repository_.write("file", "theirs\n");
                    repository_.write("new", "theirs\n");
                });
    }
    /// Expects a refusal that loses nothing, and that git refuses as well.
    void expectRefused()
    {
        EXPECT_FALSE(makeTwin().tryGit({"merge", "--quiet", "--no-edit", "topic"}).succeeded());
        auto expected = stateOf(repository_);
        const auto index = vclink::test::indexStampOf(repository_);
        EXPECT_EQ(failureOfMerge("topic"),
                  textOf(Failure{GIT_ECONFLICT, GIT_ERROR_MERGE,
                                 "1 uncommitted change would be overwritten by merge"}));
        // All that libgit2 leaves.
        expected.underWay["ORIG_HEAD"] = idOf("HEAD") + '\n';
        EXPECT_EQ(stateOf(repository_), expected);
        EXPECT_EQ(vclink::test::indexStampOf(repository_), index);
    }
};

TEST_F(RefusedThreeWayMerge, KeepsAnEditOfAFileThatItTouches)
{
    repository_.write("file", "mine\n");
    expectRefused();
}

TEST_F(RefusedThreeWayMerge, KeepsAStagedEditOfAFileThatItTouches)
{
    repository_.write("file", "mine\n");
    repository_.add({"file"});
    expectRefused();
}

TEST_F(RefusedThreeWayMerge, KeepsAStagedEditOfAnotherFile)
{
    repository_.write("other", "mine\n");
    repository_.add({"other"});
    expectRefused();
}

TEST_F(RefusedThreeWayMerge, KeepsAnUntrackedFileInTheWay)
{
    repository_.write("new", "mine\n");
    EXPECT_FALSE(makeTwin().tryGit({"merge", "--quiet", "--no-edit", "topic"}).succeeded());
    const vclink::test::NothingChanges nothing(repository_);
    EXPECT_EQ(failureOfMerge("topic"),
              textOf(Failure{GIT_ECONFLICT, GIT_ERROR_CHECKOUT,
                             "the untracked file 'new' is in the way of the checkout"}));
}

} // namespace
