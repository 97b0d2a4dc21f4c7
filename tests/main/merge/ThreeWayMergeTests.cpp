// SPDX-License-Identifier: MIT
#include <filesystem>
#include <memory>
#include <string>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "MergeFixture.hpp"
#include "main/TestOptionsFactory.hpp"
#include "support/text.hpp"

namespace
{

namespace git = vclink::git;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::Not;
using vclink::test::GitRepository;
using vclink::test::NothingChanges;
using vclink::test::stateOf;

/// A merge of diverged branches without conflicts, compared with what git makes of the same.
class ThreeWayMerge : public vclink::test::MergeFixture
{
};

TEST_F(ThreeWayMerge, OfSeparateFilesHasBoth)
{
    diverge(writing("ours", "x"), writing("theirs", "y"));
    expectCleanAsGit();
}

TEST_F(ThreeWayMerge, OfSeparateLinesOfAFileHasBoth)
{
    diverge(writing("file", "ours\n2\n3\n4\n5\n6\n7\n8\n9\n"),
            writing("file", "1\n2\n3\n4\n5\n6\n7\n8\ntheirs\n"));
    expectCleanAsGit();
    EXPECT_EQ(repository_.read("file"), "ours\n2\n3\n4\n5\n6\n7\n8\ntheirs\n");
}

TEST_F(ThreeWayMerge, OfTheSameChangeHasItOnce)
{
    diverge(
        [this]
        {
            repository_.write("file", "same\n");
            repository_.write("ours", "x");
        },
        [this]
        {
            repository_.write("file", "same\n");
            repository_.write("theirs", "x");
        });
    expectCleanAsGit();
}

TEST_F(ThreeWayMerge, OfADeletionKeepsTheFileDeleted)
{
    diverge([this] { repository_.remove("other"); }, writing("theirs", "x"));
    expectCleanAsGit();
    EXPECT_FALSE(std::filesystem::exists(repository_ / "other"));
}

TEST_F(ThreeWayMerge, OfTheirDeletionDeletesTheFile)
{
    diverge(writing("ours", "x"), [this] { repository_.remove("other"); });
    expectCleanAsGit();
    EXPECT_FALSE(std::filesystem::exists(repository_ / "other"));
}

TEST_F(ThreeWayMerge, OfAModeAndAContentHasBoth)
{
    diverge([this] { repository_.setMode("file", 0755); },
            writing("file", "1\n2\n3\n4\n5\n6\n7\n8\ntheirs\n"));
    expectCleanAsGit();
    EXPECT_EQ(repository_.git({"ls-files", "--stage", "file"}).substr(0, 6), "100755");
}

TEST_F(ThreeWayMerge, OfTheirModeTakesIt)
{
    diverge(writing("ours", "x"), [this] { repository_.setMode("other", 0755); });
    expectCleanAsGit();
}

TEST_F(ThreeWayMerge, OfTheSameModeTakesIt)
{
    diverge(
        [this]
        {
            repository_.setMode("file", 0755);
            repository_.write("ours", "x");
        },
        [this]
        {
            repository_.setMode("file", 0755);
            repository_.write("theirs", "x");
        });
    expectCleanAsGit();
}

TEST_F(ThreeWayMerge, OfARenameTakesTheOtherSidesChangeAlong)
{
    diverge(moving("file", "moved"), writing("file", "1\n2\n3\n4\n5\n6\n7\n8\ntheirs\n"));
    expectCleanAsGit();
    EXPECT_EQ(repository_.read("moved"), "1\n2\n3\n4\n5\n6\n7\n8\ntheirs\n");
}

TEST_F(ThreeWayMerge, OfTheirRenameTakesOurChangeAlong)
{
    diverge(writing("file", "ours\n2\n3\n4\n5\n6\n7\n8\n9\n"), moving("file", "moved"));
    expectCleanAsGit();
    EXPECT_FALSE(std::filesystem::exists(repository_ / "file"));
}

TEST_F(ThreeWayMerge, OfTheSameRenameOnBothSidesTakesIt)
{
    diverge(
        [this]
        {
            repository_.git({"mv", "file", "moved"});
            repository_.write("ours", "x");
        },
        [this]
        {
            repository_.git({"mv", "file", "moved"});
            repository_.write("theirs", "x");
        });
    expectCleanAsGit();
}

/// libgit2 leaves both versions beside each other; git merges them.
TEST_F(ThreeWayMerge, OfTheSameRenameWithDifferentChangesIsAConflict)
{
    diverge(
        [this]
        {
            repository_.git({"mv", "file", "moved"});
            repository_.write("moved", "ours\n2\n3\n4\n5\n6\n7\n8\n9\n");
        },
        [this]
        {
            repository_.git({"mv", "file", "moved"});
            repository_.write("moved", "1\n2\n3\n4\n5\n6\n7\n8\ntheirs\n");
        });
    EXPECT_TRUE(makeTwin().tryGit({"merge", "--quiet", "--no-edit", "topic"}).succeeded());
    expectConflicts("topic");
    EXPECT_THAT(conflicts(), ElementsAre("1 file", "2 moved", "3 moved"));
    EXPECT_EQ(repository_.read("moved~HEAD"), "ours\n2\n3\n4\n5\n6\n7\n8\n9\n");
    EXPECT_EQ(repository_.read("moved~" + idOf("topic")), "1\n2\n3\n4\n5\n6\n7\n8\ntheirs\n");
    EXPECT_FALSE(std::filesystem::exists(repository_ / "moved"));
}

TEST_F(ThreeWayMerge, OfRenamesOfDifferentFilesHasBoth)
{
    diverge(moving("file", "ours"), moving("other", "theirs"));
    expectCleanAsGit();
}

TEST_F(ThreeWayMerge, OfACaseOnlyRenameTakesIt)
{
    diverge(writing("other", "ours\n"), moving("file", "FILE"));
    expectCleanAsGit();
    EXPECT_TRUE(std::filesystem::exists(repository_ / "FILE"));
    EXPECT_FALSE(std::filesystem::exists(repository_ / "file"));
}

TEST_F(ThreeWayMerge, OfACaseOnlyRenameTakesOurChangeAlong)
{
    diverge(writing("file", "ours\n2\n3\n4\n5\n6\n7\n8\n9\n"), moving("file", "FILE"));
    expectCleanAsGit();
}

TEST_F(ThreeWayMerge, OfSymbolicLinksOfOneSideTakesThem)
{
    diverge(writing("ours", "x"), [this] { repository_.symlink("file", "link"); });
    expectCleanAsGit();
    EXPECT_EQ(std::filesystem::read_symlink(repository_ / "link"), "file");
}

TEST_F(ThreeWayMerge, OfCrissCrossHistoriesIsAsInGit)
{
    diverge(writing("ours", "1\n"), writing("theirs", "1\n"));
    crissCross(writing("file", "ours\n2\n3\n4\n5\n6\n7\n8\n9\n"),
               writing("file", "1\n2\n3\n4\n5\n6\n7\n8\ntheirs\n"));
    expectCleanAsGit();
}

TEST_F(ThreeWayMerge, WithAnOctopusAmongTheAncestorsIsAsInGit)
{
    for (const std::string name : {"one", "two", "three"})
        makeBranch(name, writing(name, name));
    repository_.git({"merge", "--quiet", "--no-edit", "one", "two", "three"});
    ASSERT_EQ(parents().size(), 3U);
    diverge(writing("file", "ours\n2\n3\n4\n5\n6\n7\n8\n9\n"),
            writing("file", "1\n2\n3\n4\n5\n6\n7\n8\ntheirs\n"));
    expectCleanAsGit();
}

TEST_F(ThreeWayMerge, OfABranchThatAnOctopusHoldsAlreadyDoesNothing)
{
    for (const std::string name : {"one", "two", "three"})
        makeBranch(name, writing(name, name));
    repository_.git({"merge", "--quiet", "--no-edit", "one", "two", "three"});
    const NothingChanges nothing(repository_);
    for (const auto *name : {"one", "two", "three"})
        EXPECT_NO_THROW(merge(name));
}

TEST_F(ThreeWayMerge, OfFileModesThatGitIgnoresIsAsInGit)
{
    repository_.git({"config", "core.fileMode", "false"});
    diverge(writing("ours", "x"), writing("file", "1\n2\n3\n4\n5\n6\n7\n8\ntheirs\n"));
    expectCleanAsGit();
}

TEST_F(ThreeWayMerge, WithTheUnionAttributeHasBothLines)
{
    repository_.write(".gitattributes", "file merge=union\n");
    repository_.commitAll("attributes");
    diverge(writing("file", "ours\n"), writing("file", "theirs\n"));
    expectCleanAsGit();
    EXPECT_EQ(repository_.read("file"), "ours\ntheirs\n");
}

TEST_F(ThreeWayMerge, WithLineEndsThatAreConvertedIsAsInGit)
{
    repository_.write(".gitattributes", "file text eol=crlf\n");
    repository_.commitAll("attributes");
    repository_.git({"rm", "--quiet", "--cached", "file"});
    repository_.git({"reset", "--quiet", "--hard"});
    diverge(writing("file", "ours\r\n2\r\n3\r\n4\r\n5\r\n6\r\n7\r\n8\r\n9\r\n"),
            writing("file", "1\r\n2\r\n3\r\n4\r\n5\r\n6\r\n7\r\n8\r\ntheirs\r\n"));
    expectCleanAsGit();
    EXPECT_EQ(repository_.read("file"), "ours\r\n2\r\n3\r\n4\r\n5\r\n6\r\n7\r\n8\r\ntheirs\r\n");
}

TEST_F(ThreeWayMerge, ShowsItsProgress)
{
    using vclink::test::ProgressCall;
    diverge(writing("ours", "x"), writing("theirs", "x"));
    merge("topic");
    EXPECT_THAT(interactor_->progress.calls,
                ElementsAre(ProgressCall(0.0), ProgressCall(1.0),
                            ProgressCall(ustring(u"Checking out theirs"))));
}

/// Whatever the host's factory gives.
TEST_F(ThreeWayMerge, AlwaysChecksOutByForce)
{
    diverge(writing("ours", "x"), writing("theirs", "x"));
    repository_.remove("other");
    git::GitAdapter adapter(vclink::test::asPath(repository_.path()),
                            std::make_shared<vclink::test::TestOptionsFactory>(interactor_));
    git::BranchManager::create(adapter)->merge("topic");
    EXPECT_EQ(repository_.read("other"), "other\n");
}

/// Changed files make it fail; see the tests of what is in the way of a merge.
TEST_F(ThreeWayMerge, PutsBackMissingFilesThatItDoesNotTouch)
{
    diverge(writing("ours", "x"), writing("theirs", "x"));
    repository_.remove("file");
    repository_.write("untracked", "mine\n");
    merge("topic");
    EXPECT_TRUE(std::filesystem::exists(repository_ / "file"));
    EXPECT_EQ(repository_.read("untracked"), "mine\n");
    EXPECT_THAT(status(), ElementsAre("?? untracked"));
}

} // namespace
