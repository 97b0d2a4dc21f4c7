// SPDX-License-Identifier: MIT
#include <filesystem>
#include <string>
#include <vector>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "BranchFixture.hpp"
#include "main/BasicBranchManager.hpp"
#include "support/Sentence.hpp"
#include "vclink/git/GitException.hpp"

namespace
{

using testing::HasSubstr;
using vclink::git::describeRepositoryState;
using namespace vclink::test;

/// "main" and "topic", which both change "file", and "topic" one commit more.
class RepositoryStateText : public BranchFixture
{
  protected:
    RepositoryStateText()
    {
        repository_.commitAll(writes("file", "one\n"), "first");
        repository_.git({"checkout", "--quiet", "-b", "topic"});
        repository_.commitAll(writes("file", "of topic\n"), "second");
        repository_.commitAll(writes("file", "more of topic\n"), "third");
        repository_.git({"checkout", "--quiet", "main"});
        repository_.commitAll(writes("file", "of main\n"), "fourth");
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
};

/// What is under way, as text and as libgit2's number, and the commands of git that lead there; the
/// last may stop at a conflict.
struct UnderWay : Sentence
{
    std::string text;
    git_repository_state_t number;
    std::vector<std::vector<std::string>> commands = {};
    std::string folder = {};
};

class RepositoryStateUnderWay : public RepositoryStateText,
                                public testing::WithParamInterface<UnderWay>
{
};

TEST_P(RepositoryStateUnderWay, HasItsText)
{
    for (const auto &command : GetParam().commands)
        repository_.tryGit(command);
    if (!GetParam().folder.empty())
        repository_.makeFolder(GetParam().folder);
    expectState(GetParam().text, GetParam().number);
}

const UnderWay allUnderWay[]{
    {{"Nothing"}, "Normal", GIT_REPOSITORY_STATE_NONE},
    {{"AMerge"}, "Conflicts", GIT_REPOSITORY_STATE_MERGE, {{"merge", "topic"}}},
    {{"AMergeWithoutConflicts"},
     "Conflicts",
     GIT_REPOSITORY_STATE_MERGE,
     {{"merge", "--quiet", "--no-commit", "-s", "ours", "topic"}}},
    {{"ARevert"}, "Conflicts", GIT_REPOSITORY_STATE_REVERT, {{"revert", "--no-edit", "HEAD~1"}}},
    {{"ARevertOfSeveral"},
     "Conflicts",
     GIT_REPOSITORY_STATE_REVERT_SEQUENCE,
     {{"revert", "--no-edit", "topic~1", "topic"}}},
    {{"ACherryPick"}, "Conflicts", GIT_REPOSITORY_STATE_CHERRYPICK, {{"cherry-pick", "topic"}}},
    {{"ACherryPickOfSeveral"},
     "Conflicts",
     GIT_REPOSITORY_STATE_CHERRYPICK_SEQUENCE,
     {{"cherry-pick", "topic~1", "topic"}}},
    {{"ABisection"}, "Bisecting", GIT_REPOSITORY_STATE_BISECT, {{"bisect", "start"}}},
    {{"ARebaseOfPatches"}, "Rebase", GIT_REPOSITORY_STATE_REBASE, {{"rebase", "--apply", "topic"}}},
    {{"AnInteractiveRebase"},
     "Rebase interactive",
     GIT_REPOSITORY_STATE_REBASE_INTERACTIVE,
     {{"-c", "sequence.editor=true", "rebase", "--interactive", "topic"}}},
    {{"ARebaseByMerging"},
     "Rebase w/merge",
     GIT_REPOSITORY_STATE_REBASE_MERGE,
     {},
     ".git/rebase-merge"},
    {{"TheApplicationOfAMailbox"},
     "Apply mailbox",
     GIT_REPOSITORY_STATE_APPLY_MAILBOX,
     {{"format-patch", "--quiet", "--output=.git/patch", "-1", "topic"}, {"am", ".git/patch"}}},
    {{"EitherRebaseOrPatches"},
     "Rebase/Apply mailbox",
     GIT_REPOSITORY_STATE_APPLY_MAILBOX_OR_REBASE,
     {},
     ".git/rebase-apply"},
};

INSTANTIATE_TEST_SUITE_P(Of, RepositoryStateUnderWay, testing::ValuesIn(allUnderWay),
                         testing::PrintToStringParamName());

TEST_F(RepositoryStateText, IsNormalBeforeTheFirstCommit)
{
    const auto empty = makeRepository("empty");
    const auto adapter = makeAdapter(empty.path());
    EXPECT_EQ(vclink::git::BranchManager::create(*adapter)->getRepositoryState(), "Normal");
}

TEST_F(RepositoryStateText, OfALinkedWorktreeIsItsOwn)
{
    const std::string linked = folder() / "linked";
    repository_.git({"worktree", "add", "--quiet", "-b", "second", linked});
    const GitRepository worktree(linked);
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

/// Then it is unknown whether a merge is under way, and operations that write must not guess.
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

TEST_F(RepositoryStateText, HasAWordForEachNumberAndNoneForOthers)
{
    const std::vector<std::string> texts{"Normal",         "Conflicts",     "Conflicts",
                                         "Conflicts",      "Conflicts",     "Conflicts",
                                         "Bisecting",      "Rebase",        "Rebase interactive",
                                         "Rebase w/merge", "Apply mailbox", "Rebase/Apply mailbox"};
    for (std::size_t i = 0; i < texts.size(); ++i)
        EXPECT_EQ(describeRepositoryState(static_cast<int>(i)), texts[i]) << i;
    for (const int number : {-1, 12, 13, 100, -1000})
        EXPECT_EQ(describeRepositoryState(number), "") << number;
}

} // namespace
