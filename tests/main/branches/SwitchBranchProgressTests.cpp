// SPDX-License-Identifier: MIT
#include <memory>
#include <stdexcept>
#include <string>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "SwitchBranchFixture.hpp"
#include "error/errorUtil/callbackException.hpp"
#include "error/logging/severity.hpp"
#include "support/LogCapture.hpp"
#include "support/cancelAt.hpp"
#include "support/text.hpp"

namespace
{

namespace git = vclink::git;
using testing::ElementsAre;
using testing::IsEmpty;
using namespace vclink::test;

class InteractorWithoutDisplay : public TestInteractor
{
  public:
    vclink::ProgressReporter *getProgressReporter() override
    {
        return nullptr;
    }
};

using SwitchBranchProgress = SwitchBranchFixture;

TEST_F(SwitchBranchProgress, ShowsItsProgress)
{
    switchTo("topic");
    EXPECT_THAT(interactor_->progress.calls,
                ElementsAre(ProgressCall(0.0), ProgressCall(1.0 / 3),
                            ProgressCall(ustring(u"Checking out b")), ProgressCall(2.0 / 3),
                            ProgressCall(ustring(u"Checking out a")), ProgressCall(1.0),
                            ProgressCall(ustring(u"Checking out folder/new"))));
}

TEST_F(SwitchBranchProgress, NotesItsProgressInTheLog)
{
    const LogCapture log(git::SeverityProgress);
    switchTo("topic");
    EXPECT_THAT(log.messages(),
                ElementsAre("Checkout Notify : 4 (a)", "Checkout Notify : 4 (folder/new)",
                            testing::StartsWith("Calls to chmod / mkdir / stat : ")));
}

TEST_F(SwitchBranchProgress, NeedsNoDisplayOrOneThatWorks)
{
    const auto expected = stateAfterGit("topic");
    interactor_->progress.onCall = [](std::size_t) { throw std::runtime_error("no display"); };
    git::GitAdapter without(asPath(repository_.path()),
                            std::make_shared<InteractorWithoutDisplay>());
    for (git::GitAdapter *const adapter : {&without, adapter_.get()})
    {
        git::BranchManager::create(*adapter)->switchBranch("topic");
        expectSame(stateOf(repository_), expected);
        EXPECT_EQ(git::pendingCallbackException(), nullptr);
        repository_.git({"checkout", "--quiet", "main"});
    }
}

TEST_F(SwitchBranchProgress, CancelledBeforeItWritesMovesNothing)
{
    for (const bool isAtOnce : {true, false})
    {
        LogCapture log(git::SeverityProgress);
        if (isAtOnce)
            interactor_->cancel();
        else
            cancelAt(log, *interactor_, "Checkout Notify : ");
        const NothingChanges nothing(repository_);
        expectCancelled([this] { switchTo("topic"); });
        EXPECT_THAT(interactor_->progress.calls, IsEmpty());
    }
    EXPECT_NO_THROW(switchTo("topic"));
    EXPECT_EQ(currentBranch(), "refs/heads/topic");
    EXPECT_THAT(status(), IsEmpty());
}

/// libgit2 notifies of all files before it writes the first, so that nothing is left to stop this
/// checkout.
TEST_F(SwitchBranchProgress, CancelledWhileItWritesStopsTheNextCheckout)
{
    interactor_->progress.onCall = [this](std::size_t number)
    {
        if (number == 3)
            interactor_->cancel();
    };
    EXPECT_NO_THROW(switchTo("topic"));
    EXPECT_EQ(currentBranch(), "refs/heads/topic");
    interactor_->progress.onCall = nullptr;
    expectCancelled([this] { switchTo("main"); });
    EXPECT_EQ(currentBranch(), "refs/heads/topic");
    EXPECT_NO_THROW(switchTo("main"));
    EXPECT_EQ(currentBranch(), "refs/heads/main");
}

} // namespace
