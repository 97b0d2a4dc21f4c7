// SPDX-License-Identifier: MIT
#include <cstddef>
#include <functional>
#include <future>
#include <memory>
#include <string>
#include <thread>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "error/errorUtil/callbackException.hpp"
#include "error/logging/severity.hpp"
#include "error/raise.hpp"
#include "main/AdapterFixture.hpp"
#include "support/LogCapture.hpp"
#include "support/RepositoryState.hpp"
#include "support/text.hpp"
#include "vclink/PollableTerminator.hpp"
#include "vclink/git/messageIdentifiers.hpp"
#include "vclink/util/exception/CancelledOperationException.hpp"

namespace
{

namespace git = vclink::git;
using testing::IsEmpty;
using testing::SizeIs;
using namespace vclink::test;
using vclink::util::exception::CancelledOperationException;

constexpr int fileCount = 300;

/// Whether a set's poller, its last part, has a request; takes it.
template <class Set> bool pollSees(Set &set)
{
    auto *const poller = reinterpret_cast<vclink::PollableTerminator *>(
        reinterpret_cast<char *>(&set) + sizeof(Set) - sizeof(vclink::PollableTerminator));
    return poller->checkAndResetCancelledState();
}

/// A repository of many files, all of them changed, the first half staged.
class RevertCancellation : public AdapterFixture
{
  protected:
    RevertCancellation()
    {
        git::pendingCallbackException() = nullptr;
        for (int i = 0; i < fileCount; ++i)
            names_.push_back("folder" + std::to_string(i % 7) + "/file" + std::to_string(i));
        for (const auto &name : names_)
            repository_.write(name, "committed\n");
        repository_.commitAll("first");
        reverted_ = stateOf(repository_);
        changeAll();
    }
    ~RevertCancellation() override
    {
        git::pendingCallbackException() = nullptr;
    }

    void changeAll()
    {
        for (const auto &name : names_)
            repository_.write(name, "changed, and longer\n");
        const auto half = names_.begin() + fileCount / 2;
        repository_.add({names_.begin(), half});
        changed_ = stateOf(repository_);
    }
    void revertAll() const
    {
        const std::string root = repository_.path().string() + '/';
        std::vector<upath> files;
        for (const auto &name : names_)
            files.push_back(asPath(root + name));
        adapter_->revertFiles(files);
    }

    /// Nothing is broken, and nothing is in the way of the next operation.
    void expectUsable() const
    {
        const auto check = repository_.tryGit({"fsck", "--strict", "--no-dangling"});
        EXPECT_TRUE(check.succeeded()) << check.errors;
        EXPECT_TRUE(repository_.tryGit({"status", "--porcelain"}).succeeded());
        EXPECT_THAT(stateOf(repository_).underWay, IsEmpty()) << "a lock was left";
    }
    void expectReverted() const
    {
        EXPECT_EQ(stateOf(repository_), reverted_);
    }
    /// Expects the index as in HEAD, which comes before the checkout, and no file written.
    void expectUnstagedOnly() const
    {
        const RepositoryState state = stateOf(repository_);
        EXPECT_EQ(state.index, reverted_.index);
        EXPECT_EQ(state.workingTree, changed_.workingTree);
        EXPECT_EQ(state.head, changed_.head);
    }

    /// Asks for cancellation in the notification of this number, 1 being the first.
    static void onNotification(LogCapture &log, int number, const std::function<void()> &action)
    {
        log.onRecord(
            [number, action, count = 0](const LogRecord &record) mutable
            {
                if (isNotification(record.message) && ++count == number)
                    action();
            });
    }
    static bool isNotification(const std::string &text)
    {
        return text.rfind("Checkout Notify : ", 0) == 0;
    }
    static std::vector<std::string> notifications(const LogCapture &log)
    {
        std::vector<std::string> texts;
        for (const auto &text : log.messages(git::SeverityProgress))
        {
            if (isNotification(text))
                texts.push_back(text);
        }
        return texts;
    }

    std::vector<std::string> names_;
    GitRepository repository_ = makeRepository();
    RepositoryState reverted_;
    RepositoryState changed_;
    const std::unique_ptr<git::GitAdapter> adapter_ = makeAdapter(repository_.path());
};

TEST_F(RevertCancellation, AskedForBeforeTheStartStopsOneCheckoutThatNotifies)
{
    interactor_->cancel();
    interactor_->cancel();
    {
        const LogCapture log(git::SeverityProgress | git::SeverityException |
                             git::SeverityDiagnostic);
        expectCancelled([this] { revertAll(); });
        EXPECT_THAT(interactor_->progress.calls, IsEmpty());
        EXPECT_THAT(
            log.messages(),
            testing::ElementsAre(testing::AllOf(testing::StartsWith("Exception caught: "),
                                                testing::HasSubstr("CancelledOperationException")),
                                 "Re-throwing error from callback"));
    }
    expectUnstagedOnly();
    expectUsable();
    EXPECT_NO_THROW(revertAll());
    expectReverted();
    expectUsable();
    // A checkout that has nothing to do does not see it.
    interactor_->cancel();
    EXPECT_NO_THROW(revertAll());
    changeAll();
    expectCancelled([this] { revertAll(); });
}

TEST_F(RevertCancellation, PutsBackTheLinksThatWereInTheWay)
{
    repository_.write("../outside/precious", "x");
    for (const auto *name : {"folder0", "folder1"})
    {
        repository_.remove(name);
        repository_.symlink("../outside", name);
    }
    changed_ = stateOf(repository_);
    LogCapture log(git::SeverityProgress);
    onNotification(log, 200, [this] { interactor_->cancel(); });
    const upath everything = asPath(repository_.path() / "*");
    EXPECT_THROW(adapter_->revertFiles({everything}), CancelledOperationException);
    expectUnstagedOnly();
    expectUsable();

    adapter_->revertFiles({everything});
    expectReverted();
    EXPECT_EQ(repository_.read("../outside/precious"), "x");
}

TEST_F(RevertCancellation, AskedForOnAnotherThreadStopsTheCheckout)
{
    std::promise<void> reached;
    std::promise<void> asked;
    std::thread person(
        [&]
        {
            reached.get_future().wait();
            interactor_->cancel();
            asked.set_value();
        });
    LogCapture log(git::SeverityProgress);
    onNotification(log, 100,
                   [&]
                   {
                       reached.set_value();
                       asked.get_future().wait();
                   });
    expectCancelled([this] { revertAll(); });
    person.join();
    EXPECT_THAT(notifications(log), SizeIs(100));
    EXPECT_THAT(interactor_->progress.calls, IsEmpty());
    expectUnstagedOnly();
    expectUsable();

    EXPECT_NO_THROW(revertAll());
    expectReverted();
}

// libgit2 notifies of all files before it writes the first.
TEST_F(RevertCancellation, AskedForDuringTheFirstFileOrAfterTheLastStopsTheNextCheckoutOnly)
{
    for (const std::size_t call : {std::size_t{3}, std::size_t{2 * fileCount + 1}})
    {
        interactor_->progress.calls.clear();
        interactor_->progress.onCall = [this, call](std::size_t number)
        {
            if (number == call)
                interactor_->cancel();
        };
        EXPECT_NO_THROW(revertAll());
        EXPECT_THAT(interactor_->progress.calls, SizeIs(2 * fileCount + 1));
        expectReverted();
        interactor_->progress.onCall = nullptr;

        changeAll();
        const LogCapture log(git::SeverityProgress);
        expectCancelled([this] { revertAll(); });
        EXPECT_THAT(notifications(log), IsEmpty());
        expectUnstagedOnly();
        expectUsable();
    }
    EXPECT_NO_THROW(revertAll());
    expectReverted();
}

TEST_F(RevertCancellation, DoesNotStopTheOtherOperations)
{
    interactor_->cancel();
    const std::string root = repository_.path().string();
    EXPECT_THAT(adapter_->getFolderStates(asPath(root)), SizeIs(fileCount));
    EXPECT_NO_THROW(adapter_->markResolved(asPath(root + '/' + names_.back())));
    expectCancelled([this] { revertAll(); });
}

TEST_F(RevertCancellation, IsStillThereAfterARevertThatIsRefused)
{
    const std::string id = repository_.line({"rev-parse", "HEAD:" + names_.front()});
    repository_.command({"update-index", "--index-info"})
        .input("0 " + std::string(40, '0') + '\t' + names_.front() + "\n100644 " + id + " 2\t" +
               names_.front() + '\n')
        .run();
    interactor_->cancel();
    EXPECT_THROW(revertAll(), git::TagException<shared_vclink::git::Conflicted>);
    repository_.git({"read-tree", "HEAD"});
    expectCancelled([this] { revertAll(); });
}

TEST_F(RevertCancellation, IsRememberedForCheckoutsAndRemotesSeparately)
{
    interactor_->cancel();
    EXPECT_TRUE(pollSees(adapter_->getCallbacks().remoteCallbacks()));
    expectCancelled([this] { revertAll(); });
    EXPECT_NO_THROW(revertAll());

    changeAll();
    interactor_->cancel();
    expectCancelled([this] { revertAll(); });
    EXPECT_TRUE(pollSees(adapter_->getCallbacks().remoteCallbacks()));
    EXPECT_FALSE(pollSees(adapter_->getCallbacks().remoteCallbacks()));
}

TEST_F(RevertCancellation, IsSeenByEachAdapterOfTheInteractor)
{
    const auto other = makeAdapter(repository_.path());
    interactor_->cancel();
    expectCancelled([this] { revertAll(); });
    EXPECT_THROW(other->revertFiles({asPath(repository_.path() / names_.front())}),
                 CancelledOperationException);
    EXPECT_NO_THROW(revertAll());
    interactor_->cancel();
    // Not the affair of an adapter that is made later.
    EXPECT_NO_THROW(makeAdapter(repository_.path())
                        ->revertFiles({asPath(repository_.path() / names_.front())}));
}

} // namespace
