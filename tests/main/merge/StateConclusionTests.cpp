// SPDX-License-Identifier: MIT
#include <filesystem>
#include <string>
#include <vector>

#include <git2/errors.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "main/files/CommitFixture.hpp"
#include "support/RepositoryState.hpp"
#include "support/Sentence.hpp"

namespace
{

using testing::Contains;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::Key;
using namespace vclink::test;

/// A commit while something other than a merge is under way: it has one parent, and ends it.
class StateConclusion : public CommitFixture
{
  protected:
    /// Two branches of one commit each, "main" and "theirs", which conflict in "file".
    StateConclusion()
    {
        repository_.git({"branch", "theirs"});
        repository_.commitAll(writes("file", "ours\n"), "ours");
        repository_.git({"checkout", "--quiet", "theirs"});
        repository_.commitAll(writes("file", "theirs\n"), "theirs");
        repository_.git({"checkout", "--quiet", "main"});
    }

    /// Runs git to where it stops at a conflict.
    void stopAt(const std::vector<std::string> &arguments) const
    {
        ASSERT_FALSE(repository_.tryGit(arguments).succeeded());
        ASSERT_NE(repository_.git({"ls-files", "--unmerged"}), "");
    }
    bool exists(const std::string &name) const
    {
        return std::filesystem::exists(repository_ / (".git/" + name));
    }
    /// Commits, expects HEAD to be the only parent and these to be gone from git's folder.
    void expectEnds(const std::vector<std::string> &names) const
    {
        for (const auto &name : names)
            ASSERT_TRUE(exists(name)) << name;
        EXPECT_FALSE(isNormal());
        const std::string head = idOf("HEAD");
        const std::string standing = repository_.read("file");
        commit("my own");
        EXPECT_THAT(parents(), ElementsAre(head));
        EXPECT_EQ(committed("file"), standing);
        EXPECT_EQ(repository_.line({"log", "-1", "--format=%B"}), "my own");
        for (const auto &name : names)
            EXPECT_FALSE(exists(name)) << name;
        EXPECT_THAT(status(), IsEmpty());
        EXPECT_TRUE(isNormal());
    }
    /// Whether git sees nothing under way.
    bool isNormal() const
    {
        for (const std::string state :
             {"merg", "revert", "cherry-pick", "rebas", "am session", "bisect"})
        {
            if (repository_.git({"status"}).find(state) != std::string::npos)
                return false;
        }
        return true;
    }
};

/// A command of git that stops at a conflict, and what it leaves in git's folder.
struct StoppedCommand : Sentence
{
    std::vector<std::string> arguments;
    std::vector<std::string> names;
};

class StoppedState : public StateConclusion, public testing::WithParamInterface<StoppedCommand>
{
};

TEST_P(StoppedState, IsEndedByACommit)
{
    repository_.git({"checkout", "--quiet", "theirs"});
    repository_.commit("theirs, too");
    repository_.git({"checkout", "--quiet", "main"});
    repository_.commitAll(writes("file", "once more\n"), "second");
    stopAt(GetParam().arguments);
    expectEnds(GetParam().names);
}

const StoppedCommand stoppedCommands[]{
    {{"Revert"}, {"revert", "--no-edit", "HEAD^"}, {"REVERT_HEAD", "MERGE_MSG"}},
    {{"SequenceOfReverts"},
     {"revert", "--no-edit", "HEAD^", "HEAD"},
     {"REVERT_HEAD", "MERGE_MSG", "sequencer"}},
    {{"CherryPick"}, {"cherry-pick", "theirs^"}, {"CHERRY_PICK_HEAD", "MERGE_MSG"}},
    {{"SequenceOfCherryPicks"},
     {"cherry-pick", "theirs^", "theirs"},
     {"CHERRY_PICK_HEAD", "MERGE_MSG", "sequencer"}},
    {{"InteractiveRebase"},
     {"-c", "sequence.editor=true", "rebase", "--interactive", "theirs"},
     {"rebase-merge", "rebase-merge/interactive", "MERGE_MSG"}},
    {{"RebaseThatAppliesPatches"}, {"rebase", "--apply", "theirs"}, {"rebase-apply"}},
};

INSTANTIATE_TEST_SUITE_P(Of, StoppedState, testing::ValuesIn(stoppedCommands),
                         testing::PrintToStringParamName());

TEST_F(StateConclusion, EndsARevertWithoutConflicts)
{
    repository_.git({"revert", "--no-commit", "HEAD"});
    expectEnds({"REVERT_HEAD", "MERGE_MSG"});
    EXPECT_EQ(idOf("HEAD^{tree}"), idOf("HEAD~2^{tree}"));
}

/// HEAD stays where the rebase left it, detached, and the branch where it was.
TEST_F(StateConclusion, EndsARebase)
{
    const std::string main = idOf("main");
    stopAt({"rebase", "theirs"});
    expectEnds({"rebase-merge", "MERGE_MSG"});
    EXPECT_TRUE(isNormal());
    EXPECT_EQ(idOf("HEAD^"), idOf("theirs"));
    EXPECT_FALSE(repository_.tryGit({"symbolic-ref", "--quiet", "HEAD"}).succeeded());
    EXPECT_EQ(idOf("main"), main);
}

TEST_F(StateConclusion, EndsTheApplicationOfAMailbox)
{
    repository_.write(".git/patches",
                      repository_.git({"format-patch", "-1", "--stdout", "theirs"}));
    ASSERT_FALSE(repository_.tryGit({"am", "--quiet", ".git/patches"}).succeeded());
    expectEnds({"rebase-apply"});
}

/// The patches that are left are nowhere else.
TEST_F(StateConclusion, DoesNotEndAMailboxThatHasMorePatches)
{
    repository_.git({"checkout", "--quiet", "theirs"});
    repository_.commitAll(writes("second", "theirs\n"), "second");
    repository_.commitAll(writes("third", "theirs\n"), "third");
    repository_.git({"checkout", "--quiet", "main"});
    repository_.write(".git/patches",
                      repository_.git({"format-patch", "-3", "--stdout", "theirs"}));
    stopAt({"am", "--3way", "--quiet", ".git/patches"});
    repository_.write("file", "resolved\n");
    repository_.git({"add", "file"});
    {
        const NothingChanges nothing(repository_);
        const Failure failure{
            GIT_ERROR, GIT_ERROR_REPOSITORY,
            "'git am' has more patches to apply, and the commit would delete them: continue with "
            "'git am --continue', or end it with 'git am --abort' or 'git am --quit'"};
        EXPECT_EQ(failureOf([this] { commit(); }), failure);
    }
    repository_.git({"am", "--quiet", "--continue"});
    EXPECT_TRUE(isNormal());
    EXPECT_EQ(committed("second"), "theirs\n");
    EXPECT_EQ(committed("third"), "theirs\n");
    EXPECT_EQ(committed("file"), "resolved\n");
}

/// Its only patch, or the last one, is what the commit concludes.
TEST_F(StateConclusion, EndsAMailboxAtItsLastPatch)
{
    repository_.git({"checkout", "--quiet", "-b", "patches", "theirs^"});
    repository_.commitAll(writes("first", "theirs\n"), "first");
    repository_.commitAll(writes("file", "theirs\n"), "second");
    repository_.git({"checkout", "--quiet", "main"});
    repository_.write(".git/patches",
                      repository_.git({"format-patch", "-2", "--stdout", "patches"}));
    ASSERT_FALSE(repository_.tryGit({"am", "--quiet", ".git/patches"}).succeeded());
    EXPECT_EQ(committed("first"), "theirs\n");
    expectEnds({"rebase-apply"});
}

/// Only the log goes, so that git takes the bisection for one that never began. HEAD stays
/// detached.
TEST_F(StateConclusion, EndsABisection)
{
    for (const auto *content : {"1", "2", "3", "4"})
    {
        repository_.write("file", content);
        repository_.commitAll(content);
    }
    const std::string main = idOf("main");
    repository_.git({"bisect", "start", "main", "main~4"});
    expectEnds({"BISECT_LOG"});
    EXPECT_EQ(idOf("main"), main);
    EXPECT_FALSE(repository_.tryGit({"bisect", "log"}).succeeded());
}

/// What git does between two steps of a bisection, up to the commit.
class DuringABisection : public StateConclusion,
                         public testing::WithParamInterface<std::vector<std::string>>
{
};

TEST_P(DuringABisection, ACommitKeepsTheBisection)
{
    for (const auto *content : {"1", "2", "3", "4"})
        repository_.commitAll(writes("other", content), content);
    repository_.git({"bisect", "start", "main", "main~4"});
    const std::string log = repository_.git({"bisect", "log"});
    static_cast<void>(repository_.tryGit(GetParam()));
    repository_.write("file", "resolved\n");
    const std::string head = idOf("HEAD");
    commit();
    EXPECT_EQ(idOf("HEAD^"), head);
    EXPECT_EQ(repository_.git({"bisect", "log"}), log);
    for (const auto *const name : {"MERGE_HEAD", "MERGE_MODE", "MERGE_MSG", "CHERRY_PICK_HEAD",
                                   "REVERT_HEAD", "rebase-merge", "sequencer"})
        EXPECT_FALSE(exists(name)) << name;
    repository_.git({"bisect", "good", "main~3"});
    EXPECT_NE(repository_.git({"bisect", "log"}), log);
}

INSTANTIATE_TEST_SUITE_P(Of, DuringABisection,
                         testing::Values(std::vector<std::string>{"merge", "--no-commit", "theirs"},
                                         std::vector<std::string>{"cherry-pick", "theirs"},
                                         std::vector<std::string>{"cherry-pick", "theirs", "main"},
                                         std::vector<std::string>{"revert", "--no-commit",
                                                                  "main~4"},
                                         std::vector<std::string>{"rebase", "theirs"}));

/// A rebase comes first for libgit2, so that it does not report the merge in it.
class MergeInARebase : public StateConclusion
{
  protected:
    /// A rebase of a merge that both sides have resolved by hand, stopped where git repeats it.
    MergeInARebase()
    {
        repository_.git({"checkout", "--quiet", "-b", "onto", "main^"});
        repository_.commitAll(writes("another", "onto\n"), "onto");
        repository_.git({"checkout", "--quiet", "main"});
        stopAt({"merge", "theirs"});
        repository_.commitAll(writes("file", "resolved\n"), "merge");
        stopAt({"rebase", "--rebase-merges", "onto"});
        repository_.write("file", "resolved again\n");
        repository_.add({"file"});
    }
};

TEST_F(MergeInARebase, KeepsACommitFromLosingAParent)
{
    ASSERT_TRUE(exists("MERGE_HEAD"));
    const Failure failure{
        GIT_ERROR, GIT_ERROR_REPOSITORY,
        "'git rebase' has stopped at a merge, and the commit would lack the history of the other "
        "side: conclude the merge with 'git commit', or the rebase with 'git rebase --continue'"};
    {
        const NothingChanges nothing(repository_);
        EXPECT_EQ(failureOf([this] { commit(); }), failure);
    }
    const std::vector<std::string> both{idOf("HEAD"), idOf("MERGE_HEAD")};
    repository_.git({"commit", "--quiet", "--no-edit"});
    EXPECT_EQ(parents(), both);
}

/// Only git would bring them back.
class PutAside : public StateConclusion,
                 public testing::WithParamInterface<std::vector<std::string>>
{
};

TEST_P(PutAside, ChangesOfTheUserKeepACommitFromEndingTheOperation)
{
    repository_.commitAll(writes("other", "other\n"), "another file");
    repository_.write("other", "mine\n");
    stopAt(GetParam());
    repository_.write("file", "resolved\n");
    repository_.git({"add", "file"});
    const NothingChanges nothing(repository_);
    const Failure failure{
        GIT_ERROR, GIT_ERROR_REPOSITORY,
        "'git merge' or 'git rebase' has put uncommitted changes aside (--autostash), and only git "
        "brings them back: conclude it with 'git commit' or 'git rebase --continue'"};
    EXPECT_EQ(failureOf([this] { commit(); }), failure);
}

TEST_P(PutAside, ChangesOfTheUserComeBackWithGit)
{
    repository_.commitAll(writes("other", "other\n"), "another file");
    repository_.write("other", "mine\n");
    stopAt(GetParam());
    repository_.write("file", "resolved\n");
    repository_.git({"add", "file"});
    if (GetParam().front() == "merge")
        repository_.git({"commit", "--quiet", "--no-edit"});
    else
        repository_.git({"-c", "core.editor=true", "rebase", "--continue"});
    EXPECT_EQ(repository_.read("other"), "mine\n");
    commit();
    EXPECT_EQ(committed("other"), "mine\n");
}

INSTANTIATE_TEST_SUITE_P(
    By, PutAside,
    testing::Values(std::vector<std::string>{"merge", "--autostash", "theirs"},
                    std::vector<std::string>{"merge", "--squash", "--autostash", "theirs"},
                    std::vector<std::string>{"rebase", "--autostash", "theirs"},
                    std::vector<std::string>{"rebase", "--apply", "--autostash", "theirs"}));

/// What git begins, stops at a conflict in "file" and has listed it for `git rerere`.
class ReusedResolution : public StateConclusion,
                         public testing::WithParamInterface<std::vector<std::string>>
{
};

/// git records the text of "file" in the next commit if the list is still there.
TEST_P(ReusedResolution, IsNotThatOfALaterCommit)
{
    for (const auto *const setting : {"rerere.enabled", "rerere.autoUpdate"})
        repository_.git({"config", setting, "true"});
    const std::string before = idOf("HEAD");
    stopAt(GetParam());
    ASSERT_NE(repository_.read(".git/MERGE_RR"), "");
    repository_.write("file", "resolved\n");
    commit();
    EXPECT_FALSE(exists("MERGE_RR"));
    repository_.write("file", "later\n");
    repository_.git({"commit", "--quiet", "--all", "--message=later"});
    repository_.git({"reset", "--quiet", "--hard", before});
    stopAt(GetParam());
    EXPECT_THAT(repository_.read("file"), testing::HasSubstr("<<<<<<<"));
}

INSTANTIATE_TEST_SUITE_P(By, ReusedResolution,
                         testing::Values(std::vector<std::string>{"merge", "theirs"},
                                         std::vector<std::string>{"merge", "--squash", "theirs"},
                                         std::vector<std::string>{"cherry-pick", "theirs"},
                                         std::vector<std::string>{"rebase", "theirs"}));

/// git takes it for the message of the next commit.
TEST_F(StateConclusion, RemovesTheMessageOfASquash)
{
    repository_.git({"branch", "aside", "main^"});
    repository_.git({"checkout", "--quiet", "aside"});
    repository_.commitAll(writes("aside", "aside\n"), "aside");
    repository_.git({"checkout", "--quiet", "main"});
    repository_.git({"merge", "--quiet", "--squash", "aside"});
    ASSERT_TRUE(exists("SQUASH_MSG"));
    commit();
    EXPECT_EQ(committed("aside"), "aside\n");
    EXPECT_FALSE(exists("SQUASH_MSG"));
    repository_.write("file", "edited\n");
    EXPECT_FALSE(repository_.command({"commit", "--all", "--no-edit"}).run().succeeded());
}

TEST_F(StateConclusion, LeavesWhatIsLeftOfAFormerMergeAlone)
{
    repository_.write(".git/ORIG_HEAD", idOf("theirs") + '\n');
    repository_.write(".git/FETCH_HEAD", idOf("theirs") + '\n');
    const std::string head = idOf("HEAD");
    commit();
    EXPECT_THAT(parents(), ElementsAre(head));
    EXPECT_THAT(stateOf(repository_).underWay, Contains(Key("ORIG_HEAD")));
    EXPECT_TRUE(exists("FETCH_HEAD"));
}

} // namespace
