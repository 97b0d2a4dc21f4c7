// SPDX-License-Identifier: MIT
// What is saved while the command of a merge runs, which may take minutes.
#include <string>

#include <git2.h>
#include <gtest/gtest.h>

#include "main/merge/DrivenMergeFixture.hpp"

namespace
{

using namespace vclink::test;

class MergeCommandObstacles : public DrivenMergeFixture
{
  protected:
    /// Has the command do this in the working copy, and then join the sides.
    void defineSaving(const std::string &change)
    {
        defineScript("(cd '" + repository_.path().string() + "' && " + change +
                     ") && cat \"$1\" \"$3\" >>\"$2\"");
    }
    void expectRefused(const std::string &text) const
    {
        const std::string head = idOf("HEAD");
        const auto index = indexOf(repository_);
        EXPECT_EQ(failureOfMerge("topic"),
                  textOf(Failure{GIT_ECONFLICT, GIT_ERROR_CHECKOUT, text}));
        EXPECT_EQ(idOf("HEAD"), head);
        EXPECT_EQ(indexOf(repository_), index);
        EXPECT_EQ(repository_.read("file"), "ours\n");
        EXPECT_EQ(branches().getRepositoryState(), "Normal");
    }
};

TEST_F(MergeCommandObstacles, AreEditsSavedMeanwhile)
{
    defineSaving("echo mine >other");
    expectRefused("the uncommitted changes of 'other' would be lost in the merge");
    EXPECT_EQ(repository_.read("other"), "mine\n");
}

TEST_F(MergeCommandObstacles, AreEditsOfTheMergedFileItself)
{
    defineSaving("echo mine >>file");
    const std::string head = idOf("HEAD");
    failureOfMerge("topic");
    EXPECT_EQ(idOf("HEAD"), head);
    EXPECT_EQ(repository_.read("file"), "ours\nmine\n");
}

TEST_F(MergeCommandObstacles, AreNewFilesThatComeMeanwhile)
{
    repository_.git({"checkout", "--quiet", "topic"});
    repository_.commitAll(writes("n/new", "theirs\n"), "new");
    repository_.git({"checkout", "--quiet", "main"});
    defineSaving("mkdir n && echo mine >n/new");
    expectRefused("the untracked file 'n/new' is in the way of the checkout");
    EXPECT_EQ(repository_.read("n/new"), "mine\n");
    repository_.remove("n");
    defineSaving("ln -s .. n");
    expectRefused("the symbolic link 'n' is in the way of the checkout");
    repository_.remove("n");
    defineSaving("mkdir n && mkfifo n/new");
    expectRefused("the FIFO, socket or device 'n/new' is in the way of the checkout");
}

TEST_F(MergeCommandObstacles, AreEditsThatGitHides)
{
    repository_.git({"checkout", "--quiet", "topic"});
    repository_.commitAll(writes("other", "theirs\n"), "other");
    repository_.git({"checkout", "--quiet", "main"});
    repository_.git({"update-index", "--skip-worktree", "other"});
    defineSaving("echo mine >other");
    const std::string head = idOf("HEAD");
    EXPECT_NE(failureOfMerge("topic").find("the changes of 'other' would be lost"),
              std::string::npos);
    EXPECT_EQ(idOf("HEAD"), head);
    EXPECT_EQ(repository_.read("other"), "mine\n");
}

} // namespace
