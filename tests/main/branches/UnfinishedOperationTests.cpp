// SPDX-License-Identifier: MIT
#include "main/mergeState/unfinishedOperation.hpp"

#include <filesystem>
#include <functional>
#include <string>

#include <git2/errors.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "fl/i18n/convert.hpp"
#include "main/merge/MergeFixture.hpp"
#include "vclink/CMAdapter.hpp"
#include "vclink/git/messageIdentifiers.hpp"

namespace
{

using namespace vclink::test;

/// An operation of git that is not over, and its name in the refusal.
struct UnfinishedOperation
{
    std::string name;
    std::string text;
    std::function<void(const GitRepository &)> begin;
};

void PrintTo(const UnfinishedOperation &operation, std::ostream *stream)
{
    *stream << operation.name;
}

/// What git does here ends in a conflict, as it should.
std::function<void(const GitRepository &)> stopping(const std::vector<std::string> &arguments)
{
    return [arguments](const GitRepository &repository)
    { EXPECT_FALSE(repository.tryGit(arguments).succeeded()); };
}

/// The user commits the step that is in conflict. The others are not done yet.
std::function<void(const GitRepository &)> committing(const std::vector<std::string> &arguments)
{
    return [arguments](const GitRepository &repository)
    {
        stopping(arguments)(repository);
        repository.write("file", "resolved\n");
        repository.git({"commit", "--quiet", "--all", "--message=resolved"});
    };
}

const UnfinishedOperation unfinishedOperations[]{
    {"merge", "a merge", stopping({"merge", "topic"})},
    {"mergeWithoutConflict", "a merge",
     [](const GitRepository &repository) {
         repository.git({"merge", "--quiet", "--no-commit", "aside"});
     }},
    {"cherryPick", "a cherry-pick", stopping({"cherry-pick", "topic"})},
    {"severalCherryPicks", "a cherry-pick", stopping({"cherry-pick", "aside", "topic"})},
    {"revert", "a revert", stopping({"revert", "--no-edit", "HEAD~1"})},
    {"restOfCherryPicks", "a series of cherry-picks or reverts",
     committing({"cherry-pick", "topic", "aside"})},
    {"restOfReverts", "a series of cherry-picks or reverts",
     committing({"revert", "--no-edit", "HEAD~1", "HEAD"})},
    {"rebase", "a rebase", stopping({"rebase", "topic"})},
    {"rebaseWithPatches", "a rebase", stopping({"rebase", "--apply", "topic"})},
    {"editInARebase", "a rebase",
     [](const GitRepository &repository)
     {
         repository.git({"-c", "sequence.editor=sed -i s/^pick/edit/", "rebase", "--quiet",
                         "--interactive", "HEAD~1"});
     }},
    {"patches", "an application of patches",
     [](const GitRepository &repository)
     {
         repository.git({"format-patch", "--quiet", "-1", "--output=../patch", "topic"});
         EXPECT_FALSE(repository.tryGit({"am", "../patch"}).succeeded());
     }}};

/// "main" and "topic" change the same line of "file"; "aside" adds a file.
class Unfinished : public MergeFixture, public testing::WithParamInterface<UnfinishedOperation>
{
  protected:
    Unfinished()
    {
        makeBranch("other-branch", writes("new", "x"));
        makeBranch("aside", writes("aside", "x"));
        diverge(writes("file", "ours\n"), writes("file", "theirs\n"));
        repository_.commitAll(writes("file", "ours, again\n"), "again");
    }
};

TEST_P(Unfinished, RefusesASwitchAndChangesNothing)
{
    GetParam().begin(repository_);
    const NothingChanges nothing(repository_);
    for (const auto *const branch : {"other-branch", "main"})
    {
        EXPECT_EQ(failureOf([&] { branches().switchBranch(branch); }),
                  (Failure{GIT_ECONFLICT, GIT_ERROR_CHECKOUT,
                           "cannot switch branches while " + GetParam().text +
                               " is under way: conclude or abort it first, see git status"}));
    }
}

INSTANTIATE_TEST_SUITE_P(Operations, Unfinished, testing::ValuesIn(unfinishedOperations),
                         testing::PrintToStringParamName());

/// A cherry-pick of "topic" and "aside" in which the user has committed "topic".
class UnfinishedSeries : public Unfinished
{
  protected:
    UnfinishedSeries()
    {
        committing({"cherry-pick", "topic", "aside"})(repository_);
    }

    void commit(const std::string &message) const
    {
        static_cast<vclink::CMAdapter &>(*adapter_).commit({}, fl::i18n::utf8_to_ustring(message));
    }
    /// Expects git to do the rest on top of the commit that is HEAD's now.
    void expectRest() const
    {
        const std::string head = idOf("HEAD");
        // The user has picked "topic".
        repository_.git({"-c", "core.editor=true", "cherry-pick", "--continue"});
        EXPECT_EQ(idOf("HEAD^"), head);
        EXPECT_EQ(repository_.read("aside"), "x");
        EXPECT_FALSE(std::filesystem::exists(repository_ / ".git/sequencer"));
    }
};

TEST_F(UnfinishedSeries, RefusesASwitchAsGit)
{
    EXPECT_FALSE(makeTwin().tryGit({"switch", "other-branch"}).succeeded());
    EXPECT_EQ(failureOf([this] { branches().switchBranch("other-branch"); }).code, GIT_ECONFLICT);
    EXPECT_EQ(branches().getRepositoryState(), "Normal");
    expectRest();
}

TEST_F(UnfinishedSeries, RefusesAMergeAndAFastForward)
{
    makeBranch("ahead", writes("ahead", "x"), "HEAD");
    for (const auto *const branch : {"other-branch", "ahead"})
    {
        const NothingChanges nothing(repository_);
        EXPECT_EQ(failureOfMerge(branch),
                  textOf(shared_vclink::git::UnableToMergeBadRepositoryState()));
    }
    expectRest();
}

TEST_F(UnfinishedSeries, IsKeptByACommit)
{
    repository_.write("other", "edited\n");
    repository_.write(".git/MERGE_MSG", "of git's last command\n");
    const GitRepository twin = makeTwin();
    twin.git({"-c", "core.editor=true", "commit", "--quiet", "--all"});
    EXPECT_FALSE(std::filesystem::exists(twin / ".git/MERGE_MSG"));
    commit("edited");
    EXPECT_FALSE(std::filesystem::exists(repository_ / ".git/MERGE_MSG"));
    EXPECT_EQ(repository_.read(".git/sequencer/todo"), twin.read(".git/sequencer/todo"));
    expectRest();
}

/// git begins a merge between two steps.
TEST_F(UnfinishedSeries, IsKeptByTheCommitOfAMerge)
{
    repository_.git({"merge", "--quiet", "--no-commit", "other-branch"});
    commit("merged");
    EXPECT_EQ(idOf("HEAD^2"), idOf("other-branch"));
    EXPECT_FALSE(std::filesystem::exists(repository_ / ".git/MERGE_HEAD"));
    EXPECT_FALSE(std::filesystem::exists(repository_ / ".git/MERGE_MODE"));
    expectRest();
}

/// libgit2 sees nothing under way.
TEST_F(Unfinished, SquashKeepsWhatGitHasPutAside)
{
    repository_.write("other", "mine\n");
    repository_.git({"merge", "--quiet", "--squash", "--autostash", "aside"});
    ASSERT_NE(repository_.read("other"), "mine\n");
    ASSERT_EQ(branches().getRepositoryState(), "Normal");
    {
        const NothingChanges nothing(repository_);
        EXPECT_EQ(failureOf([this] { branches().switchBranch("other-branch"); }),
                  (Failure{GIT_ECONFLICT, GIT_ERROR_CHECKOUT,
                           "cannot switch branches while uncommitted changes are put aside, "
                           "because only git brings them back (--autostash): conclude the merge "
                           "with 'git commit', or use 'git switch', which moves them to the "
                           "stash"}));
    }
    const GitRepository twin = makeTwin();
    twin.git({"switch", "--quiet", "other-branch"});
    EXPECT_NE(twin.git({"stash", "list"}), "");
    repository_.git({"commit", "--quiet", "--no-edit"});
    EXPECT_EQ(repository_.read("other"), "mine\n");
}

/// git takes no notice of such a file.
TEST_F(Unfinished, IsNoSeriesWithoutSteps)
{
    repository_.write(".git/sequencer/todo", "");
    EXPECT_TRUE(makeTwin().tryGit({"switch", "other-branch"}).succeeded());
    branches().switchBranch("other-branch");
    EXPECT_EQ(branches().getCurrentBranch().getName(), "other-branch");
}

TEST_F(Unfinished, IsNoFileInThePlaceOfASeries)
{
    repository_.write(".git/sequencer", "");
    branches().switchBranch("other-branch");
    EXPECT_EQ(branches().getCurrentBranch().getName(), "other-branch");
}

using UnfinishedBisection = Unfinished;

/// Both return to a branch in the end.
TEST_P(UnfinishedBisection, KeepsItsBranch)
{
    GetParam().begin(repository_);
    EXPECT_EQ(failureOf([&] { branches().deleteBranch("main"); }),
              (Failure{GIT_ERROR, GIT_ERROR_REFERENCE,
                       "cannot delete 'refs/heads/main', which a rebase or bisection needs: "
                       "conclude or abort it first, see git status"}));
    EXPECT_TRUE(repository_.tryGit({"rev-parse", "--verify", "refs/heads/main"}).succeeded());
    branches().deleteBranch("aside");
}

const UnfinishedOperation returning[]{
    {"rebase", "", stopping({"rebase", "topic"})},
    {"rebaseWithPatches", "", stopping({"rebase", "--apply", "topic"})},
    {"bisection", "",
     [](const GitRepository &repository)
     {
         repository.git({"bisect", "start"});
         repository.git({"bisect", "bad"});
         repository.git({"bisect", "good", "HEAD~2"});
     }}};

INSTANTIATE_TEST_SUITE_P(Operations, UnfinishedBisection, testing::ValuesIn(returning),
                         testing::PrintToStringParamName());

/// As git, which only warns.
TEST_F(UnfinishedBisection, AllowsASwitch)
{
    returning[2].begin(repository_);
    branches().switchBranch("other-branch");
    EXPECT_EQ(branches().getCurrentBranch().getName(), "other-branch");
}

} // namespace
