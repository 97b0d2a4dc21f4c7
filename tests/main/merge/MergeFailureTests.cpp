// SPDX-License-Identifier: MIT
#include <filesystem>
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
#include "support/Descriptors.hpp"
#include "support/LogCapture.hpp"
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
using vclink::test::asPath;
using vclink::test::asUtf8;
using vclink::test::cancelAt;
using vclink::test::Failure;
using vclink::test::LogCapture;
using vclink::test::NothingChanges;
using vclink::test::stateOf;
using vclink::test::textOf;
using vclink::util::exception::CancelledOperationException;

/// A factory whose options of a merge are what a test says.
class MergeOptionsFactory : public vclink::test::TestOptionsFactory
{
  public:
    using TestOptionsFactory::TestOptionsFactory;
    git::MergeOptions makeMergeOptions() override
    {
        onMergeOptions();
        return {};
    }

    std::function<void()> onMergeOptions;
};

/// Every cause comes out as one kind of exception, whose added text tells it.
class MergeFailure : public vclink::test::MergeFixture
{
  protected:
    void divergeInTwoFiles()
    {
        diverge(
            [this]
            {
                repository_.write("ours", "x");
                repository_.write("file", "ours\n");
            },
            [this]
            {
                repository_.write("theirs", "x");
                repository_.write("other", "theirs\n");
            });
    }
    /// Merges with `action` in the middle of it, before anything was touched.
    void mergeRaising(const std::function<void()> &action) const
    {
        const auto factory = std::make_shared<MergeOptionsFactory>(interactor_);
        factory->onMergeOptions = action;
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

TEST_F(MergeFailure, OfARepositoryThatCannotBeOpenedIsAFailedMerge)
{
    repository_.remove(".git");
    EXPECT_THAT(failureOfMerge("topic"), HasSubstr("(code -3, category 6)"));
}

TEST_F(MergeFailure, OfAMergeUnderWayTellsSoAndTouchesNothing)
{
    diverge([this] { repository_.write("file", "ours\n"); },
            [this] { repository_.write("file", "theirs\n"); });
    expectConflicts("topic");
    const NothingChanges nothing(repository_);
    EXPECT_EQ(failureOfMerge("topic"),
              textOf(shared_vclink::git::UnableToMergeBadRepositoryState()));
    EXPECT_EQ(failureOfMerge("main"), textOf(shared_vclink::git::UnableToMergeBadRepositoryState()))
        << "also one that is up to date";
}

TEST_F(MergeFailure, OfAMergeResolvedAndNotCommittedTellsSo)
{
    divergeInTwoFiles();
    repository_.git({"merge", "--quiet", "--no-commit", "topic"});
    const NothingChanges nothing(repository_);
    EXPECT_EQ(failureOfMerge("topic"),
              textOf(shared_vclink::git::UnableToMergeBadRepositoryState()));
}

TEST_F(MergeFailure, OfAnyOtherOperationUnderWayTellsSo)
{
    divergeInTwoFiles();
    const std::string head = idOf("topic") + '\n';
    const std::vector<std::string> underWay{
        "REVERT_HEAD",           "CHERRY_PICK_HEAD",     "BISECT_LOG", "rebase-merge/interactive",
        "rebase-apply/rebasing", "rebase-apply/applying"};
    for (const auto &name : underWay)
    {
        repository_.write(".git/" + name, head);
        {
            const NothingChanges nothing(repository_);
            EXPECT_EQ(failureOfMerge("topic"),
                      textOf(shared_vclink::git::UnableToMergeBadRepositoryState()))
                << name;
        }
        repository_.remove(".git/" + name.substr(0, name.find('/')));
    }
    EXPECT_NO_THROW(merge("topic"));
}

TEST_F(MergeFailure, OfAMergeUnderWayComesBeforeTheNameIsLookedUp)
{
    repository_.write(".git/REVERT_HEAD", idOf("HEAD") + '\n');
    EXPECT_EQ(failureOfMerge("missing"),
              textOf(shared_vclink::git::UnableToMergeBadRepositoryState()));
}

TEST_F(MergeFailure, OfConflictsTellsSo)
{
    diverge([this] { repository_.write("file", "ours\n"); },
            [this] { repository_.write("file", "theirs\n"); });
    EXPECT_EQ(failureOfMerge("topic"), textOf(shared_vclink::git::HasConflicts()));
    EXPECT_EQ(idOf("MERGE_HEAD"), idOf("topic"));
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

TEST_F(MergeFailure, OfAMergeWhileTheIndexIsLockedChangesNoFile)
{
    divergeInTwoFiles();
    repository_.write(".git/index.lock", "");
    auto before = stateOf(repository_);
    EXPECT_THAT(failureOfMerge("topic"), HasSubstr("(code -14, "));
    auto after = stateOf(repository_);
    EXPECT_EQ(after.head, before.head);
    EXPECT_EQ(after.index, before.index);
}

TEST_F(MergeFailure, OfACancelledCheckoutTellsWhatTheCancellationSays)
{
    divergeInTwoFiles();
    interactor_->cancel();
    const auto before = stateOf(repository_);
    EXPECT_EQ(failureOfMerge("topic"), cancellation());
    EXPECT_EQ(git::pendingCallbackException(), nullptr);
    const auto after = stateOf(repository_);
    EXPECT_EQ(after.head, before.head);
    EXPECT_EQ(after.workingTree, before.workingTree);
    EXPECT_EQ(branches().getRepositoryState(), "Normal");
}

TEST_F(MergeFailure, OfAMergeCancelledInTheMiddleLeavesTheHead)
{
    divergeInTwoFiles();
    const auto before = stateOf(repository_);
    {
        LogCapture log(git::SeverityProgress);
        cancelAt(log, *interactor_, "Checkout Notify : ");
        EXPECT_EQ(failureOfMerge("topic"), cancellation());
    }
    const auto after = stateOf(repository_);
    EXPECT_EQ(after.head, before.head);
    EXPECT_EQ(after.workingTree, before.workingTree);
    EXPECT_NO_THROW(merge("topic"));
    EXPECT_EQ(branches().getRepositoryState(), "Normal");
    EXPECT_THAT(status(), IsEmpty());
}

TEST_F(MergeFailure, OfACommandThatCannotBeStartedTellsWhatBoostSays)
{
    repository_.write(".gitattributes", "file merge=broken\n");
    repository_.git({"config", "merge.broken.driver", "/nowhere/tool %A"});
    repository_.commitAll("attributes");
    diverge([this] { repository_.write("file", "ours\n"); },
            [this] { repository_.write("file", "theirs\n"); });
    const std::string head = idOf("HEAD");
    const vclink::test::NoDescriptorLeak noLeak;
    EXPECT_THAT(failureOfMerge("topic"), HasSubstr("No such file or directory"));
    EXPECT_EQ(git::pendingCallbackException(), nullptr);
    EXPECT_EQ(idOf("HEAD"), head);
    EXPECT_EQ(repository_.read("file"), "ours\n");
    EXPECT_THAT(std::filesystem::is_empty(environment().temporary()), true);
}

TEST_F(MergeFailure, OfAStandardExceptionTellsItsWhat)
{
    divergeInTwoFiles();
    const NothingChanges nothing(repository_);
    EXPECT_EQ(addedTextOf([] { throw std::logic_error("gr\xC3\xBC\xC3\x9F"); }),
              "gr\xC3\xBC\xC3\x9F");
    EXPECT_EQ(addedTextOf([] { throw std::bad_alloc(); }), "std::bad_alloc");
    EXPECT_EQ(addedTextOf([] { throw CancelledOperationException(); }), cancellation());
}

TEST_F(MergeFailure, OfAnExceptionWithAMessageTellsIt)
{
    divergeInTwoFiles();
    const NothingChanges nothing(repository_);
    EXPECT_EQ(
        addedTextOf([] { throw git::GitException(shared_vclink::git::NoUserName(), u"more"); }),
        textOf(shared_vclink::git::NoUserName()) + "\nmore");
}

TEST_F(MergeFailure, OfAnythingElseComesOutUnchanged)
{
    divergeInTwoFiles();
    const NothingChanges nothing(repository_);
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

TEST_F(MergeFailure, ReleasesAllThatItOpened)
{
    divergeInTwoFiles();
    EXPECT_ANY_THROW(mergeRaising([] { throw 42; }));
    const vclink::test::NoDescriptorLeak noLeak;
    EXPECT_ANY_THROW(mergeRaising([] { throw 42; }));
    EXPECT_ANY_THROW(mergeRaising([] { throw std::logic_error("x"); }));
    interactor_->cancel();
    failureOfMerge("topic");
}

} // namespace
