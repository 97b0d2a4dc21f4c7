// SPDX-License-Identifier: MIT
// What becomes of a switch when another process moves the branch that it switches to.
#include <string>
#include <utility>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "MovedHeadFixture.hpp"

namespace
{

using testing::ElementsAre;
using testing::IsEmpty;
using namespace vclink::test;

/// A push or fetch of another process, for example.
class MovedTarget : public MovedHeadFixture
{
  protected:
    MovedTarget()
    {
        makeTopic(false);
        makeBranch("later", writes("file", "theirs, later\n"), "topic");
        repository_.git({"symbolic-ref", "refs/heads/alias", "refs/heads/topic"});
    }
    void moveTopic(const std::string &commit) const
    {
        repository_.git({"branch", "--force", "topic", commit});
    }
    Failure failureOfSwitch(const std::string &name) const
    {
        return failureOf([&] { branches().switchBranch(name); });
    }
    static Failure moved(const std::string &name, const std::string &state)
    {
        return {GIT_EMODIFIED, GIT_ERROR_REFERENCE,
                "another process has moved 'refs/heads/" + name + "' meanwhile; " + state};
    }
};

TEST_F(MovedTarget, RefusesASwitchBeforeItWrites)
{
    for (const std::string name : {"topic", "alias"})
    {
        const std::string before = idOf("topic");
        {
            LibGit2Recorder calls;
            calls.on<git_transaction_new>([this](auto...) { moveTopic("later"); });
            EXPECT_EQ(failureOfSwitch(name), moved(name, "nothing has been changed, try again"));
        }
        EXPECT_EQ(currentBranch(), "refs/heads/main");
        EXPECT_THAT(status(), IsEmpty());
        EXPECT_EQ(idOf("topic"), idOf("later"));
        branches().switchBranch(name);
        EXPECT_EQ(repository_.read("file"), "theirs, later\n");
        EXPECT_THAT(status(), IsEmpty());
        branches().switchBranch("main");
        moveTopic(before);
    }
}

TEST_F(MovedTarget, LeavesHeadIfASwitchHasWritten)
{
    for (const std::string name : {"topic", "alias"})
    {
        const std::string before = idOf("topic");
        {
            LibGit2Recorder calls;
            calls.on<git_checkout_tree>([this](auto...) { moveTopic("later"); });
            EXPECT_EQ(failureOfSwitch(name), moved(name, "its files have been written, but HEAD "
                                                         "has not moved: see 'git status'"));
        }
        EXPECT_EQ(currentBranch(), "refs/heads/main");
        EXPECT_THAT(status(), ElementsAre("M  file", "D  other", "A  theirs"));
        EXPECT_EQ(idOf("topic"), idOf("later"));
        EXPECT_FALSE(exists(".git/index.lock"));
        repository_.git({"reset", "--quiet", "--hard"});
        moveTopic(before);
    }
}

TEST_F(MovedTarget, IsNotMissedWhileASwitchAwaitsHead)
{
    repository_.git({"config", "core.filesRefLockTimeout", "20000"});
    LibGit2Recorder calls;
    calls.answer<git_repository_set_head>(
        [this, isFirst = true](const auto &setHead, auto... arguments) mutable
        {
            if (!std::exchange(isFirst, false))
                return setHead(arguments...);
            moveTopic("later");
            return int{GIT_ELOCKED};
        });
    EXPECT_EQ(failureOfSwitch("topic").code, GIT_EMODIFIED);
    EXPECT_EQ(currentBranch(), "refs/heads/main");
}

TEST_F(MovedTarget, MayBeDeletedOrPacked)
{
    LibGit2Recorder calls;
    calls.on<git_transaction_new>([this](auto...) { repository_.git({"pack-refs", "--all"}); });
    branches().switchBranch("later");
    EXPECT_EQ(currentBranch(), "refs/heads/later");
    calls.on<git_checkout_tree>([this](auto...) { repository_.git({"branch", "-D", "topic"}); });
    EXPECT_EQ(failureOfSwitch("topic").code, GIT_ENOTFOUND);
    EXPECT_EQ(currentBranch(), "refs/heads/later");
}

} // namespace
