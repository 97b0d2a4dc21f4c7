// SPDX-License-Identifier: MIT
#include <cstddef>
#include <string>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "InterruptedMergeFixture.hpp"
#include "support/text.hpp"

namespace
{

using testing::HasSubstr;
using namespace vclink::test;

TEST_F(InterruptedMerge, OfConflictsOnlyIsNotConcludedByACommit)
{
    diverge(writes("file", "ours\n"), writes("file", "theirs\n"));
    killMergeAt(1);
    expectRefused();
    run(wayOut());
    expectConflicts("topic");
}

TEST_F(InterruptedMerge, IsToldByAMarkerThatWasCutShortItself)
{
    makeDiverged();
    beginMergeAsLibGit2();
    repository_.write(mergeMarker, idOf("main").substr(0, 20));
    expectRefused();
    repository_.write(mergeMarker, "");
    expectRefused();
}

/// A power failure can leave these.
TEST_F(InterruptedMerge, IsToldByAMarkerThatIsFilledWithNuls)
{
    makeDiverged();
    beginMergeAsLibGit2();
    const std::string whole = markerOf("main", "topic");
    repository_.write(mergeMarker, std::string(whole.size(), '\0'));
    expectRefused();
    repository_.write(mergeMarker, whole.substr(0, 41) + std::string(41, '\0'));
    expectRefused();
    repository_.write(mergeMarker, whole.substr(0, 81) + '\0');
    expectRefused();
}

TEST_F(InterruptedMerge, IsNotToldByTheMarkerOfAnother)
{
    makeDiverged();
    repository_.write(mergeMarker, markerOf("main", "main^"));
    repository_.git({"merge", "--quiet", "--no-commit", "topic"});
    repository_.remove(".git/AUTO_MERGE");
    expectConcluded();
}

TEST_F(InterruptedMerge, IsNotConcludedOnAnotherBranchEither)
{
    makeDiverged();
    makeBranch("third", writes("third", "x"), "main^");
    killMergeAt(2);
    repository_.git({"symbolic-ref", "HEAD", "refs/heads/third"});
    repository_.git({"reset", "--quiet", "--", "."});
    expectRefused();
    repository_.write("copied", "x");
    repository_.git({"add", "--all"});
    expectRefused();
}

TEST_F(InterruptedMerge, IsOverOnceGitHasAbortedIt)
{
    diverge(writes("file", "ours\n"), writes("file", "theirs\n"));
    killMergeAt(1);
    repository_.git({"merge", "--abort"});
    repository_.tryGit({"merge", "topic"});
    repository_.git({"checkout", "--quiet", "--ours", "file"});
    repository_.add({"file"});
    expectConcluded();
}

/// git leaves no AUTO_MERGE then.
TEST_F(InterruptedMerge, IsOverOnceGitMergesByAnotherStrategy)
{
    makeDiverged();
    killMergeAt(1);
    repository_.git({"merge", "--abort"});
    repository_.git({"merge", "--quiet", "--no-commit", "--strategy=resolve", "topic"});
    ASSERT_FALSE(exists(".git/AUTO_MERGE"));
    ASSERT_TRUE(exists(mergeMarker));
    expectConcluded();
}

TEST_F(InterruptedMerge, IsNotHiddenByWhatGitLeftOfAnEarlierOne)
{
    diverge(writes("file", "ours\n"), writes("theirs", "x"));
    makeBranch("before", writes("earlier", "x"), "main^");
    repository_.git({"merge", "--quiet", "--no-commit", "before"});
    ASSERT_TRUE(exists(".git/AUTO_MERGE"));
    commit();
    killMergeAt(1);
    expectRefused();
}

/// git leaves it behind a cherry-pick that it refuses.
TEST_F(InterruptedMerge, LeavesWhatGitLeftIfItIsRefused)
{
    diverge(writes("file", "ours\n"), writes("theirs", "x"));
    const std::string tree = repository_.git({"rev-parse", "main^{tree}"});
    repository_.write(".git/AUTO_MERGE", tree);
    repository_.write("other", "edited\n");
    EXPECT_NE(failureOfMerge("topic"), "");
    EXPECT_EQ(repository_.read(".git/AUTO_MERGE"), tree);
    repository_.git({"restore", "other"});
    merge("topic");
    EXPECT_FALSE(exists(".git/AUTO_MERGE"));
}

TEST_F(InterruptedMerge, OfNoDifferenceLacksNothing)
{
    diverge(writes("file", "same\n"), writes("file", "same\n"));
    killMergeAt(1);
    expectConcluded();
}

TEST_F(InterruptedMerge, LeavesAMarkerThatTheNextCommitRemoves)
{
    repository_.write(mergeMarker, markerOf("main", "main"));
    commit();
    EXPECT_FALSE(exists(mergeMarker));
}

/// How a merge ends, other than by a signal.
TEST_F(InterruptedMerge, IsNoneThatHasEnded)
{
    makeDiverged();
    makeBranch("cancelled", writes("other", "theirs\n"), "main^");
    repository_.write(mergeMarker, markerOf("main", "topic"));
    merge("topic");
    EXPECT_FALSE(exists(mergeMarker));
    interactor_->cancel();
    EXPECT_NE(failureOfMerge("cancelled"), "");
    EXPECT_FALSE(exists(mergeMarker));
    repository_.write("other", "edited\n");
    EXPECT_NE(failureOfMerge("cancelled"), "");
    EXPECT_FALSE(exists(mergeMarker));
    EXPECT_FALSE(exists(indexLock));
}

TEST_F(InterruptedMerge, StandsInItsMarkerWhileFilesAreWritten)
{
    makeDiverged();
    const std::string expected = markerOf("main", "topic");
    std::size_t calls = 0;
    interactor_->progress.onCall = [&](std::size_t)
    {
        ++calls;
        EXPECT_EQ(repository_.read(mergeMarker), expected);
        EXPECT_TRUE(exists(indexLock));
    };
    merge("topic");
    EXPECT_GT(calls, 0U);
    EXPECT_FALSE(exists(mergeMarker));
    interactor_->progress.onCall = nullptr;
    makeBranch("conflict", writes("file", "theirs\n"));
    repository_.commitAll(writes("file", "ours\n"), "ours");
    expectConflicts("conflict");
    EXPECT_FALSE(exists(mergeMarker));
    EXPECT_FALSE(exists(indexLock));
}

TEST_F(InterruptedMerge, ByAnotherProgramIsToldByItsIndex)
{
    makeDiverged();
    beginMergeAsLibGit2();
    expectRefusedForItsIndex();
    run(wayOut());
    merge("topic");
    EXPECT_EQ(parents().size(), 2U);
}

TEST_F(InterruptedMerge, ByAnotherProgramHasNothingInCommon)
{
    repository_.git({"checkout", "--quiet", "--orphan", "topic"});
    repository_.git({"rm", "--quiet", "-rf", "."});
    repository_.commitAll(writes("theirs", "x"), "theirs");
    repository_.git({"checkout", "--quiet", "main"});
    beginMergeAsLibGit2();
    expectRefusedForItsIndex();
}

/// One that git began, one whose index has some of theirs, and one whose conflicts were all
/// resolved to ours.
TEST_F(InterruptedMerge, IsNoneOfThese)
{
    diverge(writes("file", "ours\n"),
            writes("file", "theirs\n") + writes("theirs", "x") + removes("other"));
    const std::string ours = idOf("main");
    const std::vector<Change> merges{writes(".git/MERGE_MODE", ""),
                                     runsGit({"checkout", "--quiet", "topic", "--", "theirs"}),
                                     runsGit({"rm", "--quiet", "other"})};
    for (const auto &change : merges)
    {
        beginMergeAsLibGit2();
        expectRefusedForItsIndex();
        change(repository_);
        expectConcluded();
        repository_.git({"reset", "--quiet", "--hard", ours});
    }
    repository_.git({"checkout", "--quiet", "-B", "topic", "main^"});
    repository_.commitAll(writes("file", "theirs\n"), "in conflict only");
    repository_.git({"checkout", "--quiet", "main"});
    beginMergeAsLibGit2();
    expectConcluded();
}

/// Their new file is the other half of a conflict.
TEST_F(InterruptedMerge, IsNoneOfARenameThatIsResolvedToOurs)
{
    diverge(removes("file"), moves("file", "renamed"));
    expectConflicts("topic");
    repository_.remove("renamed");
    for (const auto *name : {"file", "renamed"})
        adapter_->markResolved(asPath(repository_ / name));
    expectConcluded();
}

/// A merge takes nothing of it.
TEST_F(InterruptedMerge, IsNoneOfATypeThatChangesWhereOursIsRenamed)
{
    diverge(moves("file", "renamed"), removes("file") + links("other", "file"));
    beginMergeAsLibGit2();
    expectConcluded();
}

TEST_F(InterruptedMerge, IsNoneOfSeveralHeads)
{
    makeDiverged();
    makeBranch("third", writes("third", "x"), "main^");
    beginMergeAsLibGit2();
    repository_.write(".git/MERGE_HEAD", idOf("topic") + "\n" + idOf("third") + "\n");
    commit();
    EXPECT_EQ(parents().size(), 3U);
}

/// Can't be told from one that was killed: the text names git's own commit as well.
TEST_F(InterruptedMerge, IsSuspectedWhereEverythingOfTheirsWasPutBack)
{
    makeDiverged();
    repository_.git({"merge", "--quiet", "--no-commit", "--strategy=ours", "topic"});
    expectRefusedForItsIndex();
    EXPECT_THAT(failureOf([this] { commit(); }).text, HasSubstr("run: git commit"));
    repository_.git({"commit", "--quiet", "--no-edit"});
    EXPECT_EQ(parents().size(), 2U);
}

} // namespace
