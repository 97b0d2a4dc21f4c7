// SPDX-License-Identifier: MIT
#include <memory>
#include <stdexcept>
#include <string>
#include <utility>
#include <vector>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "MergeFixture.hpp"
#include "error/errorUtil/callbackException.hpp"
#include "error/logging/severity.hpp"
#include "main/TestOptionsFactory.hpp"
#include "support/LogCapture.hpp"
#include "support/cancelAt.hpp"
#include "support/text.hpp"
#include "vclink/git/GitException.hpp"
#include "vclink/util/exception/CancelledOperationException.hpp"

namespace
{

namespace git = vclink::git;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using namespace vclink::test;
using vclink::util::exception::CancelledOperationException;

/// "topic" is ahead of main: it changes "file", drops "other" and has "folder/new".
class FastForward : public MergeFixture
{
  protected:
    FastForward()
    {
        makeBranch("topic", writes("file", "of topic\n") + removes("other") +
                                writes("folder/new", "x") + writes("same", "x"));
    }

    static std::string cancellation()
    {
        return CancelledOperationException().what();
    }
};

TEST_F(FastForward, MovesTheBranchTheIndexAndTheFilesAndMakesNoCommit)
{
    const std::string objects = repository_.git({"count-objects"});
    const std::string target = idOf("topic");
    expectAsGit();
    EXPECT_EQ(idOf("main"), target);
    EXPECT_EQ(currentBranch(), "refs/heads/main");
    EXPECT_EQ(repository_.git({"count-objects"}), objects);
    EXPECT_THAT(status(), IsEmpty());
    EXPECT_EQ(branches().getRepositoryState(), "Normal");
    EXPECT_THAT(stateOf(repository_).underWay, IsEmpty());
}

TEST_F(FastForward, WritesNoMessageOfItsOwnIntoTheReflog)
{
    merge("topic");
    EXPECT_EQ(repository_.line({"log", "--walk-reflogs", "-1", "--format=%gs", "main"}), "");
    EXPECT_EQ(repository_.line({"log", "--walk-reflogs", "-1", "--format=%H", "main"}),
              idOf("topic"));
}

TEST_F(FastForward, KeepsChangesThatItDoesNotTouch)
{
    repository_.git({"checkout", "--quiet", "topic"});
    repository_.commitAll(writes("more", "x"), "more");
    repository_.git({"checkout", "--quiet", "topic~1"});
    repository_.write("same", "mine\n");
    repository_.write("untracked", "mine\n");
    merge("topic");
    EXPECT_EQ(repository_.read("same"), "mine\n");
    EXPECT_EQ(repository_.read("untracked"), "mine\n");
    EXPECT_EQ(idOf("HEAD"), idOf("topic"));
    EXPECT_THAT(status(), ElementsAre(" M same", "?? untracked"));
}

/// Whatever the host's factory gives.
TEST_F(FastForward, IsRefusedByWorkInItsWay)
{
    const auto factory = std::make_shared<TestOptionsFactory>(interactor_);
    factory->checkoutOptions.checkoutStrategy = GIT_CHECKOUT_FORCE;
    git::GitAdapter forcing(asPath(repository_.path()), factory);
    const std::string conflict = "1 conflict prevents checkout";
    const std::vector<std::pair<Change, std::string>> works{
        {writes("file", "mine\n"),
         "the uncommitted changes of 'file' would be lost in the checkout"},
        {writes("file", "mine\n") + runsGit({"add", "file"}), conflict},
        {writes("folder/new", "mine\n"), conflict},
        {writes("other", "mine\n"),
         "the uncommitted changes of 'other' would be lost in the checkout"}};
    for (const auto &[work, text] : works)
    {
        work(repository_);
        {
            const NothingChanges nothing(repository_);
            EXPECT_EQ(failureOfMerge("topic"),
                      textOf(Failure{GIT_ECONFLICT, GIT_ERROR_CHECKOUT, text}));
            EXPECT_THROW(git::BranchManager::create(forcing)->merge("topic"), git::GitException);
        }
        repository_.git({"reset", "--quiet", "--hard"});
        repository_.git({"clean", "--quiet", "--force", "-d"});
    }
}

TEST_F(FastForward, OverwritesAnIgnoredFileAsGitDoes)
{
    repository_.write(".git/info/exclude", "folder/\n");
    repository_.write("folder/new", "mine\n");
    expectAsGit();
    EXPECT_EQ(repository_.read("folder/new"), "x");
}

TEST_F(FastForward, LeavesTheBranchWhenItCannotBeMoved)
{
    const std::string before = idOf("main");
    interactor_->progress.onCall = [this](std::size_t)
    { repository_.write(".git/refs/heads/main.lock", ""); };
    EXPECT_THAT(failureOfMerge("topic"), HasSubstr("(code -14"));
    EXPECT_EQ(idOf("main"), before);
    EXPECT_EQ(repository_.read("file"), "of topic\n");
    EXPECT_EQ(branches().getRepositoryState(), "Normal");
}

TEST_F(FastForward, ShowsItsProgress)
{
    merge("topic");
    EXPECT_THAT(interactor_->progress.calls,
                ElementsAre(ProgressCall(0.0), ProgressCall(0.25),
                            ProgressCall(ustring(u"Checking out other")), ProgressCall(0.5),
                            ProgressCall(ustring(u"Checking out file")), ProgressCall(0.75),
                            ProgressCall(ustring(u"Checking out folder/new")), ProgressCall(1.0),
                            ProgressCall(ustring(u"Checking out same"))));
}

TEST_F(FastForward, GoesOnWhenItsProgressCannotBeShown)
{
    interactor_->progress.onCall = [](std::size_t) { throw std::runtime_error("no display"); };
    EXPECT_NO_THROW(merge("topic"));
    EXPECT_EQ(idOf("main"), idOf("topic"));
    EXPECT_EQ(git::pendingCallbackException(), nullptr);
}

TEST_F(FastForward, CancelledBeforeItWritesMovesNothing)
{
    for (const bool isAtOnce : {true, false})
    {
        LogCapture log(git::SeverityProgress);
        if (isAtOnce)
            interactor_->cancel();
        else
            cancelAt(log, *interactor_, "Checkout Notify : ");
        const NothingChanges nothing(repository_);
        EXPECT_EQ(failureOfMerge("topic"), cancellation());
        EXPECT_EQ(git::pendingCallbackException(), nullptr);
        EXPECT_THAT(interactor_->progress.calls, IsEmpty());
    }
    EXPECT_NO_THROW(merge("topic"));
    EXPECT_EQ(idOf("main"), idOf("topic"));
}

/// libgit2 notifies of all files before it writes the first, so that nothing is left to stop this
/// checkout.
TEST_F(FastForward, CancelledWhileItWritesStopsTheNextCheckout)
{
    interactor_->progress.onCall = [this](std::size_t number)
    {
        if (number == 3)
            interactor_->cancel();
    };
    EXPECT_NO_THROW(merge("topic"));
    EXPECT_EQ(idOf("main"), idOf("topic"));
    interactor_->progress.onCall = nullptr;
    repository_.git({"reset", "--quiet", "--hard", "HEAD~1"});
    const NothingChanges nothing(repository_);
    EXPECT_EQ(failureOfMerge("topic"), cancellation());
}

} // namespace
