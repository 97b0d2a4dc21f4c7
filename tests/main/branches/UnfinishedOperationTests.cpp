// SPDX-License-Identifier: MIT
#include "main/mergeState/unfinishedOperation.hpp"

#include <functional>
#include <string>

#include <git2/errors.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "main/merge/MergeFixture.hpp"

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

const UnfinishedOperation unfinishedOperations[]{
    {"merge", "a merge", stopping({"merge", "topic"})},
    {"mergeWithoutConflict", "a merge",
     [](const GitRepository &repository) {
         repository.git({"merge", "--quiet", "--no-commit", "aside"});
     }},
    {"cherryPick", "a cherry-pick", stopping({"cherry-pick", "topic"})},
    {"severalCherryPicks", "a cherry-pick", stopping({"cherry-pick", "aside", "topic"})},
    {"revert", "a revert", stopping({"revert", "--no-edit", "HEAD~1"})},
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
