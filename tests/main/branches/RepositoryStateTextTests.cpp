// SPDX-License-Identifier: MIT
#include <filesystem>
#include <string>
#include <vector>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "BranchFixture.hpp"
#include "main/BasicBranchManager.hpp"
#include "vclink/git/GitException.hpp"

namespace
{

using testing::HasSubstr;
using vclink::git::describeRepositoryState;
using vclink::test::failureOf;
using vclink::test::NothingChanges;

/// "main" and "topic", which both change "file", and "topic" one commit more.
class RepositoryStateText : public vclink::test::BranchFixture
{
  protected:
    RepositoryStateText()
    {
        repository_.write("file", "one\n");
        repository_.commitAll("first");
        repository_.git({"checkout", "--quiet", "-b", "topic"});
        repository_.write("file", "of topic\n");
        repository_.commitAll("second");
        repository_.write("file", "more of topic\n");
        repository_.commitAll("third");
        repository_.git({"checkout", "--quiet", "main"});
        repository_.write("file", "of main\n");
        repository_.commitAll("fourth");
    }

    void expectState(const std::string &text, int number) const
    {
        git_repository *handle = nullptr;
        ASSERT_EQ(git_repository_open(&handle, repository_.path().c_str()), 0);
        EXPECT_EQ(git_repository_state(handle), number);
        git_repository_free(handle);
        const NothingChanges nothing(repository_);
        EXPECT_EQ(branches().getRepositoryState(), text);
    }
    /// Stops at a conflict.
    void begin(const std::vector<std::string> &command) const
    {
        ASSERT_FALSE(repository_.tryGit(command).succeeded());
    }
};

TEST_F(RepositoryStateText, IsNormalWhenNothingIsUnderWay)
{
    expectState("Normal", GIT_REPOSITORY_STATE_NONE);
}

TEST_F(RepositoryStateText, IsNormalBeforeTheFirstCommit)
{
    const auto empty = makeRepository("empty");
    const auto adapter = makeAdapter(empty.path());
    EXPECT_EQ(vclink::git::BranchManager::create(*adapter)->getRepositoryState(), "Normal");
}

TEST_F(RepositoryStateText, IsConflictsDuringAMerge)
{
    begin({"merge", "topic"});
    expectState("Conflicts", GIT_REPOSITORY_STATE_MERGE);
}

TEST_F(RepositoryStateText, IsConflictsDuringAMergeOfTheManagersOwn)
{
    EXPECT_ANY_THROW(branches().merge("topic"));
    expectState("Conflicts", GIT_REPOSITORY_STATE_MERGE);
}

TEST_F(RepositoryStateText, IsConflictsDuringAMergeWithoutConflicts)
{
    repository_.git({"merge", "--quiet", "--no-commit", "-s", "ours", "topic"});
    expectState("Conflicts", GIT_REPOSITORY_STATE_MERGE);
}

TEST_F(RepositoryStateText, IsConflictsDuringARevert)
{
    begin({"revert", "--no-edit", "HEAD~1"});
    expectState("Conflicts", GIT_REPOSITORY_STATE_REVERT);
}

TEST_F(RepositoryStateText, IsConflictsDuringARevertOfSeveral)
{
    begin({"revert", "--no-edit", "topic~1", "topic"});
    expectState("Conflicts", GIT_REPOSITORY_STATE_REVERT_SEQUENCE);
}

TEST_F(RepositoryStateText, IsConflictsDuringACherryPick)
{
    begin({"cherry-pick", "topic"});
    expectState("Conflicts", GIT_REPOSITORY_STATE_CHERRYPICK);
}

TEST_F(RepositoryStateText, IsConflictsDuringACherryPickOfSeveral)
{
    begin({"cherry-pick", "topic~1", "topic"});
    expectState("Conflicts", GIT_REPOSITORY_STATE_CHERRYPICK_SEQUENCE);
}

TEST_F(RepositoryStateText, IsBisectingDuringABisection)
{
    repository_.git({"bisect", "start"});
    expectState("Bisecting", GIT_REPOSITORY_STATE_BISECT);
}

TEST_F(RepositoryStateText, IsRebaseDuringARebaseOfPatches)
{
    begin({"rebase", "--apply", "topic"});
    expectState("Rebase", GIT_REPOSITORY_STATE_REBASE);
}

TEST_F(RepositoryStateText, IsRebaseInteractiveDuringAnInteractiveRebase)
{
    begin({"-c", "sequence.editor=true", "rebase", "--interactive", "topic"});
    expectState("Rebase interactive", GIT_REPOSITORY_STATE_REBASE_INTERACTIVE);
}

TEST_F(RepositoryStateText, IsRebaseWithMergeDuringARebaseByMerging)
{
    repository_.makeFolder(".git/rebase-merge");
    expectState("Rebase w/merge", GIT_REPOSITORY_STATE_REBASE_MERGE);
}

TEST_F(RepositoryStateText, IsApplyMailboxWhilePatchesAreApplied)
{
    const std::string patch = repository_.git({"format-patch", "--stdout", "-1", "topic"});
    EXPECT_FALSE(repository_.command({"am"}).input(patch).run().succeeded());
    expectState("Apply mailbox", GIT_REPOSITORY_STATE_APPLY_MAILBOX);
}

TEST_F(RepositoryStateText, IsEitherWhereRebaseAndPatchesCannotBeTold)
{
    repository_.makeFolder(".git/rebase-apply");
    expectState("Rebase/Apply mailbox", GIT_REPOSITORY_STATE_APPLY_MAILBOX_OR_REBASE);
}

TEST_F(RepositoryStateText, OfALinkedWorktreeIsItsOwn)
{
    const std::string linked = folder() / "linked";
    repository_.git({"worktree", "add", "--quiet", "-b", "second", linked});
    const vclink::test::GitRepository worktree(linked);
    EXPECT_FALSE(worktree.tryGit({"merge", "topic"}).succeeded());
    const auto adapter = makeAdapter(linked);
    EXPECT_EQ(vclink::git::BranchManager::create(*adapter)->getRepositoryState(), "Conflicts");
    EXPECT_EQ(branches().getRepositoryState(), "Normal");
}

TEST_F(RepositoryStateText, FailsOnlyWhereTheRepositoryCannotBeOpened)
{
    repository_.remove(".git");
    EXPECT_EQ(failureOf([this] { branches().getRepositoryState(); }).code, GIT_ENOTFOUND);
}

/// Nothing tells then whether a merge is under way, and what would write must not guess.
TEST_F(RepositoryStateText, IsNormalWhereMergeHeadCannotBeLookedAt)
{
    const std::string file = repository_ / ".git/MERGE_HEAD";
    const std::string head = idOf("HEAD");
    std::filesystem::create_symlink("MERGE_HEAD", file);
    EXPECT_EQ(branches().getRepositoryState(), "Normal");
    const std::string text = "could not read '" + file + "': Too many levels of symbolic links";
    EXPECT_EQ(failureOf([this] { adapter_->commit(upath(), u"message"); }).text, text);
    try
    {
        branches().merge("topic");
        ADD_FAILURE() << "merged";
    }
    catch (const vclink::git::GitException &exception)
    {
        EXPECT_THAT(exception.what(), HasSubstr(text));
    }
    std::filesystem::remove(file);
    EXPECT_EQ(idOf("HEAD"), head);
    EXPECT_TRUE(status().empty());
}

TEST_F(RepositoryStateText, HasAWordForEachNumber)
{
    const std::vector<std::string> texts{"Normal",         "Conflicts",     "Conflicts",
                                         "Conflicts",      "Conflicts",     "Conflicts",
                                         "Bisecting",      "Rebase",        "Rebase interactive",
                                         "Rebase w/merge", "Apply mailbox", "Rebase/Apply mailbox"};
    for (std::size_t i = 0; i < texts.size(); ++i)
        EXPECT_EQ(describeRepositoryState(static_cast<int>(i)), texts[i]) << i;
}

TEST_F(RepositoryStateText, IsEmptyForAnyOtherNumber)
{
    for (const int number : {-1, 12, 13, 100, -1000})
        EXPECT_EQ(describeRepositoryState(number), "") << number;
}

} // namespace
