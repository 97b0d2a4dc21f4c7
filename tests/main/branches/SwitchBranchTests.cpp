// SPDX-License-Identifier: MIT
#include <filesystem>
#include <memory>
#include <string>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "SwitchBranchFixture.hpp"
#include "error/logging/severity.hpp"
#include "main/TestOptionsFactory.hpp"
#include "support/Descriptors.hpp"
#include "support/LogCapture.hpp"
#include "support/text.hpp"
#include "vclink/git/LibGit2Exception.hpp"
#include "vclink/util/exception/CancelledOperationException.hpp"

namespace
{

namespace git = vclink::git;
using testing::ElementsAre;
using testing::IsEmpty;
using vclink::test::asPath;
using vclink::test::failureOf;
using vclink::test::LogCapture;
using vclink::test::NothingChanges;
using vclink::test::stateOf;
using vclink::util::exception::CancelledOperationException;

const std::string switchSignature =
    "virtual void vclink::git::BasicBranchManager::switchBranch(const BranchName&)";

class SwitchBranch : public vclink::test::SwitchBranchFixture
{
};

TEST_F(SwitchBranch, MovesTheWorkingTreeTheIndexAndTheHeadAsGitDoes)
{
    const auto expected = stateAfterGit("topic");
    switchTo("topic");
    expectSame(stateOf(repository_), expected);
    EXPECT_EQ(currentBranch(), "refs/heads/topic");
    EXPECT_THAT(status(), IsEmpty());
    EXPECT_EQ(branches().getCurrentBranch().getName(), "topic");
}

TEST_F(SwitchBranch, GoesThereAndBack)
{
    auto before = stateOf(repository_);
    switchTo("topic");
    switchTo("main");
    auto after = stateOf(repository_);
    EXPECT_NE(after.reflog, before.reflog);
    expectSame(after, before);
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

TEST_F(SwitchBranch, LeavesADetachedHead)
{
    repository_.git({"checkout", "--quiet", "--detach"});
    switchTo("topic");
    EXPECT_EQ(currentBranch(), "refs/heads/topic");
    EXPECT_THAT(status(), IsEmpty());
}

TEST_F(SwitchBranch, LeavesAnUnbornBranch)
{
    repository_.git({"checkout", "--quiet", "--orphan", "unborn"});
    repository_.git({"rm", "-r", "--quiet", "--force", "."});
    switchTo("topic");
    EXPECT_EQ(currentBranch(), "refs/heads/topic");
    EXPECT_THAT(status(), IsEmpty());
}

TEST_F(SwitchBranch, TakesNamesWithFoldersAndLetters)
{
    const std::string name = "feature/gr\xC3\xBC\xC3\x9F";
    repository_.git({"branch", name, "topic"});
    switchTo(name);
    EXPECT_EQ(currentBranch(), "refs/heads/" + name);
    EXPECT_TRUE(std::filesystem::exists(repository_ / "folder/new"));
}

TEST_F(SwitchBranch, WritesModesAndLinks)
{
    repository_.git({"checkout", "--quiet", "-b", "modes"});
    repository_.setMode("a", 0755);
    repository_.symlink("a", "link");
    repository_.commitAll("modes");
    repository_.git({"checkout", "--quiet", "main"});
    const auto expected = stateAfterGit("modes");
    switchTo("modes");
    expectSame(stateOf(repository_), expected);
    EXPECT_EQ(std::filesystem::read_symlink(repository_ / "link"), "a");
}

TEST_F(SwitchBranch, KeepsChangesThatTheBranchDoesNotTouch)
{
    repository_.write("same", "mine\n");
    repository_.write("untracked", "mine\n");
    const auto expected = stateAfterGit("topic");
    switchTo("topic");
    expectSame(stateOf(repository_), expected);
    EXPECT_EQ(repository_.read("same"), "mine\n");
    EXPECT_EQ(repository_.read("untracked"), "mine\n");
}

TEST_F(SwitchBranch, KeepsAStagedChangeThatTheBranchDoesNotTouch)
{
    repository_.write("same", "mine\n");
    repository_.add({"same"});
    const auto expected = stateAfterGit("topic");
    switchTo("topic");
    EXPECT_EQ(repository_.read("same"), "mine\n");
    EXPECT_EQ(stateOf(repository_).head, expected.head);
}

TEST_F(SwitchBranch, IsRefusedByAChangeThatTheBranchTouches)
{
    repository_.write("a", "mine\n");
    expectRefused("topic", {GIT_ECONFLICT, GIT_ERROR_CHECKOUT, "1 conflict prevents checkout"});
    EXPECT_FALSE(repository_.tryGit({"checkout", "--quiet", "topic"}).succeeded());
}

TEST_F(SwitchBranch, IsRefusedByAStagedChangeThatTheBranchTouches)
{
    repository_.write("a", "mine\n");
    repository_.add({"a"});
    expectRefused("topic", {GIT_ECONFLICT, GIT_ERROR_CHECKOUT, "1 conflict prevents checkout"});
}

TEST_F(SwitchBranch, IsRefusedByAnUntrackedFileInTheWay)
{
    repository_.write("folder/new", "mine\n");
    expectRefused("topic", {GIT_ECONFLICT, GIT_ERROR_CHECKOUT, "1 conflict prevents checkout"});
}

TEST_F(SwitchBranch, IsRefusedByAChangeOfAFileThatTheBranchDrops)
{
    repository_.write("b", "mine\n");
    expectRefused("topic", {GIT_ECONFLICT, GIT_ERROR_CHECKOUT, "1 conflict prevents checkout"});
}

TEST_F(SwitchBranch, CountsTheFilesInItsWay)
{
    repository_.write("a", "mine\n");
    repository_.write("b", "mine\n");
    expectRefused("topic", {GIT_ECONFLICT, GIT_ERROR_CHECKOUT, "2 conflicts prevent checkout"});
}

TEST_F(SwitchBranch, OverwritesAnIgnoredFileAsGitDoes)
{
    repository_.write(".git/info/exclude", "folder/\n");
    repository_.write("folder/new", "mine\n");
    const auto expected = stateAfterGit("topic");
    switchTo("topic");
    expectSame(stateOf(repository_), expected);
    EXPECT_EQ(repository_.read("folder/new"), "x");
}

TEST_F(SwitchBranch, TakesLocalBranchesOnly)
{
    repository_.git({"tag", "v1", "topic"});
    repository_.git({"update-ref", "refs/remotes/origin/topic", "topic"});
    for (const std::string &name :
         {std::string("v1"), std::string("origin/topic"), idOf("topic"), idOf("topic").substr(0, 8),
          std::string("topic~1"), std::string("refs/heads/topic"), std::string("HEAD"),
          std::string("missing")})
    {
        const NothingChanges nothing(repository_);
        const auto failure = failureOf([&] { switchTo(name); });
        EXPECT_THAT(failure.code, testing::AnyOf(GIT_ENOTFOUND, GIT_EINVALIDSPEC)) << name;
        EXPECT_EQ(failure.errorClass, GIT_ERROR_REFERENCE) << name;
    }
}

TEST_F(SwitchBranch, FailsForAnEmptyName)
{
    const NothingChanges nothing(repository_);
    EXPECT_LT(failureOf([this] { switchTo(""); }).code, 0);
}

/// The tree is the one that the name means as a revision, and there a tag comes first.
TEST_F(SwitchBranch, TakesTheTreeOfATagThatHidesTheBranch)
{
    repository_.git({"tag", "topic", "main"});
    switchTo("topic");
    EXPECT_EQ(currentBranch(), "refs/heads/topic");
    EXPECT_EQ(repository_.read("a"), "of main\n");
}

TEST_F(SwitchBranch, FailsWhereTheRepositoryCannotBeOpened)
{
    repository_.remove(".git");
    EXPECT_EQ(failureOf([this] { switchTo("topic"); }).code, GIT_ENOTFOUND);
}

/// libgit2 finds that out when the files are written.
TEST_F(SwitchBranch, IsRefusedIfAnotherWorkingCopyHasTheBranch)
{
    repository_.git({"worktree", "add", "--quiet", "../other copy", "topic"});
    const vclink::test::Failure failure{
        GIT_ERROR, GIT_ERROR_REPOSITORY,
        "cannot set HEAD to reference 'refs/heads/topic' as it is the "
        "current HEAD of a linked repository."};
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

TEST_F(SwitchBranch, IsRefusedWhileTheIndexIsLocked)
{
    repository_.write(".git/index.lock", "");
    const std::string head = idOf("HEAD");
    EXPECT_EQ(failureOf([this] { switchTo("topic"); }).code, GIT_ELOCKED);
    EXPECT_EQ(currentBranch(), "refs/heads/main");
    EXPECT_EQ(idOf("HEAD"), head);
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

TEST_F(SwitchBranch, IsTracedWithItsParameter)
{
    const LogCapture log(git::SeverityScopeEntry | git::SeverityParameter | git::SeverityScopeExit);
    switchTo("topic");
    const auto messages = log.messages();
    ASSERT_GE(messages.size(), 3U);
    EXPECT_EQ(messages[0], switchSignature);
    EXPECT_EQ(messages[1], " branch=topic");
    EXPECT_EQ(messages.back(), switchSignature);
    EXPECT_EQ(log.records()[0].severity, git::SeverityScopeEntry);
    EXPECT_EQ(log.records()[1].severity, git::SeverityParameter);
    EXPECT_EQ(log.records().back().severity, git::SeverityScopeExit);
}

TEST_F(SwitchBranch, IsTracedBeforeTheRepositoryIsOpened)
{
    repository_.remove(".git");
    const LogCapture log(git::SeverityScopeEntry | git::SeverityParameter | git::SeverityScopeExit);
    EXPECT_THROW(switchTo("topic"), git::LibGit2Exception);
    const auto messages = log.messages();
    ASSERT_GE(messages.size(), 3U);
    EXPECT_EQ(messages[0], switchSignature);
    EXPECT_EQ(messages[1], " branch=topic");
    EXPECT_EQ(messages.back(), switchSignature + " [throw]");
}

TEST_F(SwitchBranch, LogsNothingOfItsOwnBesides)
{
    const LogCapture log(git::SeverityDiagnostic | git::SeverityException);
    switchTo("topic");
    EXPECT_THAT(log.messages(), IsEmpty());
}

TEST_F(SwitchBranch, TakesTheStrategyOfTheHostsFactory)
{
    class Factory : public vclink::test::TestOptionsFactory
    {
      public:
        using TestOptionsFactory::TestOptionsFactory;
        git::CheckoutOptions makeCheckoutOptions() override
        {
            git::CheckoutOptions options;
            options.checkoutStrategy = GIT_CHECKOUT_FORCE;
            return options;
        }
    };
    git::GitAdapter adapter(asPath(repository_.path()), std::make_shared<Factory>(interactor_));
    repository_.write("a", "mine\n");
    git::BranchManager::create(adapter)->switchBranch("topic");
    EXPECT_EQ(repository_.read("a"), "of topic, and longer\n");
    EXPECT_EQ(currentBranch(), "refs/heads/topic");
}

TEST_F(SwitchBranch, LeavesNoDescriptorOpen)
{
    switchTo("topic");
    const vclink::test::NoDescriptorLeak noLeak;
    switchTo("main");
    interactor_->cancel();
    expectCancelled("topic");
    repository_.write("a", "mine\n");
    EXPECT_THROW(switchTo("topic"), git::LibGit2Exception);
}

} // namespace
