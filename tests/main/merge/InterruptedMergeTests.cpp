// SPDX-License-Identifier: MIT
#include <csignal>
#include <cstddef>
#include <filesystem>
#include <string>
#include <vector>

#include <git2/errors.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/wait.h>
#include <unistd.h>

#include "MergeFixture.hpp"
#include "support/Command.hpp"
#include "support/text.hpp"

namespace
{

namespace fs = std::filesystem;
using testing::HasSubstr;
using namespace vclink::test;

constexpr const char *mergeMarker = ".git/vclink-merge";
constexpr const char *indexLock = ".git/index.lock";

/// A merge whose process was killed, and the commits that follow.
class InterruptedMerge : public MergeFixture
{
  protected:
    void commit() const
    {
        adapter_->commit(upath(), u"concluded");
    }
    bool exists(const std::string &name) const
    {
        return fs::exists(repository_ / name);
    }
    std::string markerOf(const std::string &ours, const std::string &theirs) const
    {
        return idOf(ours) + "\n" + idOf(theirs) + "\n";
    }

    /// Merges "topic" in a process that is killed at this call of the progress display, the first
    /// of which comes before the first file is written, and removes the lock that it leaves.
    void killMergeAt(std::size_t call) const
    {
        const pid_t child = ::fork();
        ASSERT_GE(child, 0);
        if (child == 0)
        {
            interactor_->progress.onCall = [call](std::size_t number)
            {
                if (number == call)
                    ::kill(::getpid(), SIGKILL);
            };
            static_cast<void>(failureOf([this] { merge("topic"); }));
            ::_exit(0);
        }
        int status = 0;
        ASSERT_EQ(::waitpid(child, &status, 0), child);
        ASSERT_TRUE(WIFSIGNALED(status)) << "the merge came to its end";
        EXPECT_EQ(repository_.read(mergeMarker), markerOf("main", "topic"));
        ASSERT_TRUE(exists(indexLock));
        EXPECT_EQ(failureOf([this] { commit(); }).code, GIT_ELOCKED);
        repository_.remove(indexLock);
    }
    void expectRefused() const
    {
        const NothingChanges nothing(repository_);
        const Failure failure = failureOf([this] { commit(); });
        EXPECT_EQ(failure.code, GIT_ERROR);
        EXPECT_EQ(failure.errorClass, GIT_ERROR_MERGE);
        EXPECT_THAT(failure.text, HasSubstr("the merge of " + idOf("topic") + " was interrupted"));
    }
    /// What another program leaves that uses libgit2 and was killed before it wrote a file.
    void beginMergeAsLibGit2() const
    {
        repository_.write(".git/MERGE_HEAD", idOf("topic") + "\n");
        repository_.write(".git/MERGE_MODE", "no-ff");
        repository_.write(".git/MERGE_MSG", "Merge branch 'topic'");
    }
    void expectRefusedForItsIndex() const
    {
        const NothingChanges nothing(repository_);
        const Failure failure = failureOf([this] { commit(); });
        EXPECT_EQ(failure.errorClass, GIT_ERROR_MERGE);
        EXPECT_THAT(failure.text,
                    HasSubstr("nothing of what only " + idOf("topic") + " has changed"));
    }
    void expectConcluded() const
    {
        commit();
        EXPECT_EQ(parents().size(), 2U);
        EXPECT_EQ(repository_.read(".git/HEAD"), "ref: refs/heads/main\n");
        EXPECT_FALSE(exists(".git/MERGE_HEAD"));
    }
    /// The commands in the text of a refused commit.
    std::string wayOut() const
    {
        const std::string text = failureOf([this] { commit(); }).text;
        const std::string beginning = "in the root of the working copy: ";
        const auto found = text.find(beginning);
        return found == std::string::npos ? "false" : text.substr(found + beginning.size());
    }
    void run(const std::string &commands) const
    {
        const auto result = Command({"sh", "-ec", commands}).in(repository_.path()).run();
        EXPECT_TRUE(result.succeeded()) << commands;
        EXPECT_EQ(result.errors, "") << commands;
    }
};

/// Kinds of changes, in the order in which libgit2 writes them: deletions first.
class KilledMerge : public InterruptedMerge, public testing::WithParamInterface<std::size_t>
{
  protected:
    KilledMerge()
    {
        repository_.write("both", "1\n2\n3\n4\n5\n6\n7\n");
        repository_.write("renamed", "one line\nand another\nand a third\n");
        for (const auto *name : {"deleted", "untouched", "sub/tracked", "becomes a file/a",
                                 "becomes a file/b", "becomes a folder"})
            repository_.write(name, "x");
        repository_.commitAll(writes(".gitignore", "*.ignored\n"), "more");
        diverge(writes("both", "ours\n2\n3\n4\n5\n6\n7\n") + moves("renamed", "of another name"),
                writes("both", "1\n2\n3\n4\n5\n6\ntheirs\n") + removes("deleted") +
                    writes("renamed", "one line\nand another\nand a third\nof theirs\n") +
                    writes("file", "theirs\n") + writes("new", std::string("\0binary\1", 8)) +
                    writes("sub/new", "theirs\n") + writes("fresh/new", "theirs\n") +
                    removes("becomes a file") + writes("becomes a file", "theirs\n") +
                    removes("becomes a folder") + writes("becomes a folder/a", "theirs\n") +
                    writes("becomes a folder/b", "theirs\n") +
                    writes("forced.ignored", "theirs\n") +
                    runsGit({"add", "--force", "forced.ignored"}));
        repository_.write("untracked", "mine");
        repository_.write("sub/untracked", "mine");
        repository_.write("mine.ignored", "mine");
        before_ = stateOf(repository_);
    }

    RepositoryState before_;
};

TEST_P(KilledMerge, IsNotConcludedByACommit)
{
    killMergeAt(GetParam());
    expectRefused();
    repository_.git({"add", "--update"});
    expectRefused();
}

TEST_P(KilledMerge, IsTakenBackByTheCommandsThatTheRefusalNames)
{
    killMergeAt(GetParam());
    run(wayOut());
    const auto after = stateOf(repository_);
    EXPECT_EQ(after.head, before_.head);
    EXPECT_EQ(after.index, before_.index);
    EXPECT_EQ(after.workingTree, before_.workingTree);
    EXPECT_EQ(after.underWay.count("MERGE_HEAD"), 0U);
    merge("topic");
    EXPECT_EQ(parents(), (std::vector<std::string>{idOf("main^"), idOf("topic")}));
    EXPECT_EQ(repository_.read("both"), "ours\n2\n3\n4\n5\n6\ntheirs\n");
    EXPECT_EQ(repository_.read("sub/new"), "theirs\n");
    EXPECT_EQ(repository_.read("becomes a file"), "theirs\n");
    EXPECT_EQ(repository_.read("becomes a folder/b"), "theirs\n");
    EXPECT_THAT(repository_.read("of another name"), HasSubstr("of theirs"));
    EXPECT_FALSE(exists("deleted"));
    EXPECT_EQ(repository_.read("sub/untracked"), "mine");
}

TEST_P(KilledMerge, IsTakenBackWithoutWhatWasEditedSince)
{
    killMergeAt(GetParam());
    // The last in a file of the merge.
    for (const auto *name : {"untouched", "later", "sub/later", "file"})
        repository_.write(name, "edited since\n");
    run(wayOut());
    for (const auto *name : {"untouched", "later", "sub/later"})
        EXPECT_EQ(repository_.read(name), "edited since\n") << name;
    EXPECT_EQ(repository_.git({"show", "stash@{0}:file"}), "edited since\n");
    EXPECT_EQ(repository_.git({"status", "--porcelain", "--untracked-files=no"}), " M untouched\n");
    commit();
    merge("topic");
    EXPECT_EQ(repository_.git({"show", "HEAD:untouched"}), "edited since\n");
    EXPECT_EQ(repository_.git({"show", "HEAD:fresh/new"}), "theirs\n");
}

INSTANTIATE_TEST_SUITE_P(AtCall, KilledMerge, testing::Values(1U, 2U, 3U, 4U, 6U, 8U, 10U, 12U));

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
