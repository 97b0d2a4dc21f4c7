// SPDX-License-Identifier: MIT
#include <filesystem>
#include <string>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "main/files/CommitFixture.hpp"

namespace
{

using testing::Contains;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::Key;
using vclink::test::stateOf;

/// A commit while something other than a merge is under way: it has one parent, and ends it.
class StateConclusion : public vclink::test::CommitFixture
{
  protected:
    /// Two branches of one commit each, "main" and "theirs", which conflict in "file".
    StateConclusion()
    {
        repository_.git({"branch", "theirs"});
        repository_.write("file", "ours\n");
        repository_.commitAll("ours");
        repository_.git({"checkout", "--quiet", "theirs"});
        repository_.write("file", "theirs\n");
        repository_.commitAll("theirs");
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

TEST_F(StateConclusion, EndsARevert)
{
    repository_.write("file", "once more\n");
    repository_.commitAll("second");
    stopAt({"revert", "--no-edit", "HEAD^"});
    expectEnds({"REVERT_HEAD", "MERGE_MSG"});
}

TEST_F(StateConclusion, EndsARevertWithoutConflicts)
{
    repository_.git({"revert", "--no-commit", "HEAD"});
    expectEnds({"REVERT_HEAD", "MERGE_MSG"});
    EXPECT_EQ(idOf("HEAD^{tree}"), idOf("HEAD~2^{tree}"));
}

TEST_F(StateConclusion, EndsACherryPick)
{
    stopAt({"cherry-pick", "theirs"});
    expectEnds({"CHERRY_PICK_HEAD", "MERGE_MSG"});
}

TEST_F(StateConclusion, EndsASequenceOfCherryPicks)
{
    repository_.git({"checkout", "--quiet", "theirs"});
    repository_.commit("theirs, too");
    repository_.git({"checkout", "--quiet", "main"});
    stopAt({"cherry-pick", "theirs^", "theirs"});
    expectEnds({"CHERRY_PICK_HEAD", "MERGE_MSG", "sequencer"});
}

TEST_F(StateConclusion, EndsASequenceOfReverts)
{
    repository_.write("file", "once more\n");
    repository_.commitAll("second");
    stopAt({"revert", "--no-edit", "HEAD^", "HEAD"});
    expectEnds({"REVERT_HEAD", "MERGE_MSG", "sequencer"});
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

TEST_F(StateConclusion, EndsAnInteractiveRebase)
{
    stopAt({"-c", "sequence.editor=true", "rebase", "--interactive", "theirs"});
    expectEnds({"rebase-merge", "rebase-merge/interactive", "MERGE_MSG"});
}

TEST_F(StateConclusion, EndsARebaseThatAppliesPatches)
{
    stopAt({"rebase", "--apply", "theirs"});
    expectEnds({"rebase-apply"});
}

TEST_F(StateConclusion, EndsTheApplicationOfAMailbox)
{
    repository_.write(".git/patches",
                      repository_.git({"format-patch", "-1", "--stdout", "theirs"}));
    ASSERT_FALSE(repository_.tryGit({"am", "--quiet", ".git/patches"}).succeeded());
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

/// A rebase comes first for libgit2, so that the merge in it is not seen.
TEST_F(StateConclusion, EndsARebaseAndAMergeInItWithOneParent)
{
    stopAt({"rebase", "theirs"});
    repository_.write(".git/MERGE_HEAD", idOf("main") + '\n');
    expectEnds({"rebase-merge", "MERGE_HEAD", "MERGE_MSG"});
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
