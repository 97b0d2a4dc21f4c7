// SPDX-License-Identifier: MIT
#include <functional>
#include <memory>
#include <string>
#include <utility>
#include <vector>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "SwitchBranchFixture.hpp"
#include "error/logging/severity.hpp"
#include "main/TestOptionsFactory.hpp"
#include "support/LogCapture.hpp"
#include "support/text.hpp"

namespace
{

namespace git = vclink::git;
using testing::ElementsAre;
using testing::IsEmpty;
using namespace vclink::test;

const std::string switchSignature =
    "virtual void vclink::git::BasicBranchManager::switchBranch(const BranchName&)";

using SwitchBranch = SwitchBranchFixture;

/// There and back; with modes and links, and a name with folders and letters.
TEST_F(SwitchBranch, MovesTheWorkingTreeTheIndexAndTheHeadAsGitDoes)
{
    const std::string modes = "feature/gr\xC3\xBC\xC3\x9F";
    repository_.git({"checkout", "--quiet", "-b", modes});
    repository_.setMode("a", 0755);
    repository_.commitAll(links("a", "link"), "modes");
    repository_.git({"checkout", "--quiet", "main"});
    for (const std::string &name : {std::string("topic"), modes, std::string("main")})
    {
        const auto expected = stateAfterGit(name);
        const auto before = stateOf(repository_);
        switchTo(name);
        expectSame(stateOf(repository_), expected);
        EXPECT_NE(stateOf(repository_).reflog, before.reflog);
        EXPECT_EQ(currentBranch(), "refs/heads/" + name);
        EXPECT_THAT(status(), IsEmpty());
        EXPECT_EQ(branches().getCurrentBranch().getName(), name);
    }
}

TEST_F(SwitchBranch, ToTheCurrentBranchChangesNoFile)
{
    const auto before = workingTreeOf(repository_);
    repository_.write("a", "mine\n");
    switchTo("main");
    EXPECT_EQ(repository_.read("a"), "mine\n");
    EXPECT_EQ(workingTreeOf(repository_).size(), before.size());
    EXPECT_EQ(currentBranch(), "refs/heads/main");
}

TEST_F(SwitchBranch, LeavesADetachedHeadOrAnUnbornBranch)
{
    repository_.git({"checkout", "--quiet", "--detach"});
    switchTo("topic");
    EXPECT_EQ(currentBranch(), "refs/heads/topic");
    EXPECT_THAT(status(), IsEmpty());
    repository_.git({"checkout", "--quiet", "--orphan", "unborn"});
    repository_.git({"rm", "-r", "--quiet", "--force", "."});
    switchTo("main");
    EXPECT_EQ(currentBranch(), "refs/heads/main");
    EXPECT_THAT(status(), IsEmpty());
}

/// And overwrites ignored files, as git does.
TEST_F(SwitchBranch, KeepsChangesThatTheBranchDoesNotTouch)
{
    repository_.write(".git/info/exclude", "folder/\n");
    repository_.write("folder/new", "mine\n");
    repository_.write("same", "mine\n");
    repository_.write("untracked", "mine\n");
    const auto staged = [this] { repository_.add({"same"}); };
    for (const std::function<void()> &change :
         {std::function<void()>([] {}), std::function<void()>(staged)})
    {
        change();
        const auto expected = stateAfterGit("topic");
        switchTo("topic");
        expectSame(stateOf(repository_), expected);
        EXPECT_EQ(repository_.read("same"), "mine\n");
        EXPECT_EQ(repository_.read("untracked"), "mine\n");
        EXPECT_EQ(repository_.read("folder/new"), "x");
        switchTo("main");
    }
}

TEST_F(SwitchBranch, IsRefusedByWorkInItsWay)
{
    const auto edited = [](const std::string &name)
    { return "the uncommitted changes of '" + name + "' would be lost in the checkout"; };
    const std::vector<std::pair<std::vector<std::string>, std::string>> works{
        {{"a"}, edited("a")},
        {{"b"}, edited("b")},
        {{"a", "b"}, edited("a")},
        {{"folder/new"}, "1 conflict prevents checkout"}};
    for (const auto &[names, text] : works)
    {
        for (const auto &name : names)
            repository_.write(name, "mine\n");
        expectRefused("topic", {GIT_ECONFLICT, GIT_ERROR_CHECKOUT, text});
        EXPECT_FALSE(repository_.tryGit({"checkout", "--quiet", "topic"}).succeeded());
        repository_.git({"stash", "--quiet", "--include-untracked"});
    }
    repository_.write("a", "mine\n");
    repository_.add({"a"});
    expectRefused("topic", {GIT_ECONFLICT, GIT_ERROR_CHECKOUT, "1 conflict prevents checkout"});
}

TEST_F(SwitchBranch, TakesLocalBranchesOnly)
{
    repository_.git({"tag", "v1", "topic"});
    repository_.git({"update-ref", "refs/remotes/origin/topic", "topic"});
    for (const std::string &name :
         {std::string("v1"), std::string("origin/topic"), idOf("topic"), idOf("topic").substr(0, 8),
          std::string("topic~1"), std::string("refs/heads/topic"), std::string("HEAD"),
          std::string("missing"), std::string()})
    {
        const NothingChanges nothing(repository_);
        const auto failure = failureOf([&] { switchTo(name); });
        EXPECT_THAT(failure.code, testing::AnyOf(GIT_ENOTFOUND, GIT_EINVALIDSPEC)) << name;
        EXPECT_EQ(failure.errorClass, GIT_ERROR_REFERENCE) << name;
    }
}

/// libgit2 would write the files of the other reference.
TEST_F(SwitchBranch, IsRefusedIfTheNameMeansAnotherCommitFirst)
{
    const std::vector<std::pair<std::string, std::string>> others{
        {"refs/topic", "main"}, {"refs/tags/topic", "main"}, {"refs/tags/topic", "topic:a"}};
    for (const auto &[reference, target] : others)
    {
        repository_.git({"update-ref", reference, target});
        expectRefused("topic", {GIT_EAMBIGUOUS, GIT_ERROR_REFERENCE,
                                "'topic' is also another reference, which comes before the branch: "
                                "switch with 'git switch', or rename one of them"});
        repository_.git({"update-ref", "-d", reference});
    }
}

TEST_F(SwitchBranch, MayShareItsNameWithATagOfTheSameCommit)
{
    repository_.git({"tag", "--annotate", "--message=tag", "topic", "topic"});
    switchTo("topic");
    EXPECT_EQ(currentBranch(), "refs/heads/topic");
    EXPECT_TRUE(status().empty());
}

/// libgit2 finds that out when the files are written.
TEST_F(SwitchBranch, IsRefusedIfAnotherWorkingCopyHasTheBranch)
{
    repository_.git({"worktree", "add", "--quiet", "../other copy", "topic"});
    const Failure failure{GIT_ERROR, GIT_ERROR_REFERENCE,
                          "cannot switch to 'refs/heads/topic', which another working tree has "
                          "checked out, or needs for a rebase or bisection: see git worktree list "
                          "('git worktree prune' forgets those whose folders are gone)"};
    expectRefused("topic", failure);
    repository_.git({"checkout", "--quiet", "--detach"});
    {
        const NothingChanges nothing(repository_);
        EXPECT_EQ(failureOf([this] { switchTo("topic"); }), failure);
    }
    switchTo("main");
    switchTo("main");
    repository_.git({"worktree", "remove", "../other copy"});
    switchTo("topic");
    EXPECT_EQ(currentBranch(), "refs/heads/topic");
}

/// The files and the index have moved then, which `git status` shows.
TEST_F(SwitchBranch, LeavesTheHeadWhenItCannotBeMoved)
{
    interactor_->progress.onCall = [this](std::size_t) { repository_.write(".git/HEAD.lock", ""); };
    EXPECT_EQ(failureOf([this] { switchTo("topic"); }).code, GIT_ELOCKED);
    EXPECT_EQ(currentBranch(), "refs/heads/main");
    EXPECT_EQ(repository_.read("a"), "of topic, and longer\n");
    EXPECT_THAT(status(), ElementsAre("M  a", "D  b", "A  folder/new"));
}

TEST_F(SwitchBranch, IsTracedWithItsParameterAndLogsNothingElse)
{
    const LogCapture log(git::SeverityScopeEntry | git::SeverityParameter | git::SeverityScopeExit |
                         git::SeverityDiagnostic | git::SeverityException);
    switchTo("topic");
    const auto messages = log.messages();
    ASSERT_GE(messages.size(), 3U);
    EXPECT_EQ(messages[0], switchSignature);
    EXPECT_EQ(messages[1], " branch=topic");
    EXPECT_EQ(messages.back(), switchSignature);
    EXPECT_EQ(log.records()[0].severity, git::SeverityScopeEntry);
    EXPECT_EQ(log.records()[1].severity, git::SeverityParameter);
    EXPECT_EQ(log.records().back().severity, git::SeverityScopeExit);
    EXPECT_THAT(log.messages(git::SeverityDiagnostic), IsEmpty());
    EXPECT_THAT(log.messages(git::SeverityException), IsEmpty());
}

TEST_F(SwitchBranch, IsTracedBeforeTheRepositoryIsOpened)
{
    repository_.remove(".git");
    const LogCapture log(git::SeverityScopeEntry | git::SeverityParameter | git::SeverityScopeExit);
    EXPECT_EQ(failureOf([this] { switchTo("topic"); }).code, GIT_ENOTFOUND);
    const auto messages = log.messages();
    ASSERT_GE(messages.size(), 3U);
    EXPECT_EQ(messages[0], switchSignature);
    EXPECT_EQ(messages[1], " branch=topic");
    EXPECT_EQ(messages.back(), switchSignature + " [throw]");
}

TEST_F(SwitchBranch, TakesTheStrategyOfTheHostsFactory)
{
    const auto factory = std::make_shared<TestOptionsFactory>(interactor_);
    factory->checkoutOptions.checkoutStrategy = GIT_CHECKOUT_FORCE;
    git::GitAdapter adapter(asPath(repository_.path()), factory);
    repository_.write("a", "mine\n");
    git::BranchManager::create(adapter)->switchBranch("topic");
    EXPECT_EQ(repository_.read("a"), "of topic, and longer\n");
    EXPECT_EQ(currentBranch(), "refs/heads/topic");
}

} // namespace
