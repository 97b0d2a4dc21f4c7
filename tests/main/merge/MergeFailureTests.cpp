// SPDX-License-Identifier: MIT
#include <functional>
#include <memory>
#include <stdexcept>
#include <string>
#include <vector>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "MergeFixture.hpp"
#include "error/errorUtil/callbackException.hpp"
#include "error/logging/severity.hpp"
#include "main/TestOptionsFactory.hpp"
#include "support/LogCapture.hpp"
#include "support/NothingLeft.hpp"
#include "support/cancelAt.hpp"
#include "support/text.hpp"
#include "vclink/git/GitException.hpp"
#include "vclink/git/messageIdentifiers.hpp"
#include "vclink/util/exception/CancelledOperationException.hpp"

namespace
{

namespace git = vclink::git;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using namespace vclink::test;
using vclink::util::exception::CancelledOperationException;

/// Every cause becomes the same kind of exception, with the cause as added text.
class MergeFailure : public MergeFixture
{
  protected:
    void divergeInTwoFiles()
    {
        diverge(writes("ours", "x") + writes("file", "ours\n"),
                writes("theirs", "x") + writes("other", "theirs\n"));
    }
    /// Merges with `action` in the middle of it, before anything was touched.
    void mergeRaising(const std::function<void()> &action) const
    {
        const auto factory = std::make_shared<TestOptionsFactory>(interactor_);
        factory->onMergeOptions = [&]
        {
            // The test's, the adapter's, the manager's and the merge's.
            EXPECT_EQ(factory.use_count(), 4);
            action();
        };
        git::GitAdapter adapter(asPath(repository_.path()), factory);
        git::BranchManager::create(adapter)->merge("topic");
    }
    std::string addedTextOf(const std::function<void()> &action) const
    {
        try
        {
            mergeRaising(action);
            ADD_FAILURE() << "no exception";
        }
        catch (const git::GitException &exception)
        {
            EXPECT_EQ(exception.GetID(), "shared_vclink:git:MergeFailed");
            const std::string text = asUtf8(exception.GetUnicodeMessageTxt());
            return text.substr(text.find('\n') + 1);
        }
        return {};
    }
    /// Expects that no branch is merged, not even looked up, and that nothing is changed.
    void expectRefusedForItsState(const std::vector<std::string> &names) const
    {
        const NothingChanges nothing(repository_);
        for (const auto &name : names)
            EXPECT_EQ(failureOfMerge(name),
                      textOf(shared_vclink::git::UnableToMergeBadRepositoryState()));
    }
    static std::string cancellation()
    {
        return CancelledOperationException().what();
    }
};

TEST_F(MergeFailure, NamesTheBranchAndTheCauseOnALineOfItsOwn)
{
    const NothingChanges nothing(repository_);
    try
    {
        merge("missing");
        FAIL();
    }
    catch (const git::GitException &exception)
    {
        EXPECT_EQ(asUtf8(exception.GetUnicodeMessageTxt()),
                  "\"missing\" could not be merged into the current branch.\n"
                  "Git could not complete the operation: revspec 'missing' not found (code -3, "
                  "category 4)");
    }
}

TEST_F(MergeFailure, OfANameThatIsNoAsciiOrEmptyTellsLibGit2sText)
{
    const NothingChanges nothing(repository_);
    const std::string name = "gr\xC3\xBC\xC3\x9F";
    EXPECT_EQ(failureOfMerge(name), textOf(Failure{GIT_ENOTFOUND, GIT_ERROR_REFERENCE,
                                                   "revspec '" + name + "' not found"}));
    EXPECT_THAT(failureOfMerge(""), HasSubstr("(code -"));
}

TEST_F(MergeFailure, OfAnOperationUnderWayTellsSoAndTouchesNothing)
{
    divergeInTwoFiles();
    const std::vector<std::string> underWay{
        "MERGE_HEAD",           "REVERT_HEAD",           "CHERRY_PICK_HEAD",
        "BISECT_LOG",           "rebase-apply/applying", "rebase-merge/interactive",
        "rebase-apply/rebasing"};
    for (const auto &name : underWay)
    {
        SCOPED_TRACE(name);
        repository_.write(".git/" + name, idOf("topic") + '\n');
        expectRefusedForItsState({"topic", "main", "missing"});
        repository_.remove(".git/" + name.substr(0, name.find('/')));
    }
    // Resolved, and not committed.
    repository_.git({"merge", "--quiet", "--no-commit", "topic"});
    expectRefusedForItsState({"topic"});
    repository_.git({"merge", "--abort"});
    EXPECT_NO_THROW(merge("topic"));
}

TEST_F(MergeFailure, OfConflictsUnderWayTouchesNothing)
{
    diverge(writes("file", "ours\n"), writes("file", "theirs\n"));
    expectConflicts("topic");
    expectRefusedForItsState({"topic", "main"});
}

TEST_F(MergeFailure, WithoutAnIdentityLeavesTheMergeToBeCommitted)
{
    divergeInTwoFiles();
    repository_.git({"config", "--unset", "user.name"});
    repository_.git({"config", "--unset", "user.email"});
    const std::string head = idOf("HEAD");
    // Neither the configuration nor the environment names anybody, and the host's name alone does
    // not either.
    EXPECT_EQ(failureOfMerge("topic"), textOf(shared_vclink::git::NoUserName()));
    EXPECT_EQ(idOf("HEAD"), head);
    EXPECT_EQ(branches().getRepositoryState(), "Conflicts");
    EXPECT_EQ(idOf("MERGE_HEAD"), idOf("topic"));
    EXPECT_EQ(conflicts(), std::vector<std::string>());
    repository_.git({"config", "user.name", "Test Person"});
    repository_.git({"config", "user.email", "person@example.com"});
    adapter_->commit(upath(), u"by hand");
    EXPECT_THAT(parents(), ElementsAre(head, idOf("topic")));
    EXPECT_EQ(branches().getRepositoryState(), "Normal");
}

TEST_F(MergeFailure, OfACancelledCheckoutTellsWhatTheCancellationSays)
{
    divergeInTwoFiles();
    const auto before = stateOf(repository_);
    for (const bool isAtOnce : {true, false})
    {
        LogCapture log(git::SeverityProgress);
        if (isAtOnce)
            interactor_->cancel();
        else
            cancelAt(log, *interactor_, "Checkout Notify : ");
        EXPECT_EQ(failureOfMerge("topic"), cancellation());
        EXPECT_EQ(git::pendingCallbackException(), nullptr);
        const auto after = stateOf(repository_);
        EXPECT_EQ(after.head, before.head);
        EXPECT_EQ(after.workingTree, before.workingTree);
        EXPECT_EQ(branches().getRepositoryState(), "Normal");
    }
    EXPECT_NO_THROW(merge("topic"));
    EXPECT_THAT(status(), IsEmpty());
}

/// libgit2 does not report files in conflict, so nothing asks for the cancellation.
TEST_F(MergeFailure, OfConflictsAloneLeavesACancellationToTheNextCheckout)
{
    diverge(writes("file", "ours\n"), writes("file", "theirs\n"));
    interactor_->cancel();
    expectConflicts("topic");
    repository_.git({"merge", "--abort"});
    EXPECT_THROW(branches().switchBranch("topic"), CancelledOperationException);
    branches().switchBranch("topic");
    EXPECT_THAT(status(), IsEmpty());
}

TEST_F(MergeFailure, OfAStandardExceptionTellsItsWhatOrItsMessage)
{
    divergeInTwoFiles();
    const NothingChanges nothing(repository_);
    EXPECT_EQ(addedTextOf([] { throw std::logic_error("gr\xC3\xBC\xC3\x9F"); }),
              "gr\xC3\xBC\xC3\x9F");
    EXPECT_EQ(addedTextOf([] { throw std::bad_alloc(); }), "std::bad_alloc");
    EXPECT_EQ(addedTextOf([] { throw CancelledOperationException(); }), cancellation());
    EXPECT_EQ(
        addedTextOf([] { throw git::GitException(shared_vclink::git::NoUserName(), u"more"); }),
        textOf(shared_vclink::git::NoUserName()) + "\nmore");
}

TEST_F(MergeFailure, OfAnythingElseComesOutUnchanged)
{
    divergeInTwoFiles();
    const NothingChanges nothing(repository_);
    const NothingLeft check(environment().temporary());
    try
    {
        mergeRaising([] { throw 42; });
        FAIL() << "no exception";
    }
    catch (int number)
    {
        EXPECT_EQ(number, 42);
    }
}

} // namespace
