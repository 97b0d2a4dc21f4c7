// SPDX-License-Identifier: MIT
// The way of an exception from a callback through libgit2 to the caller.
#include <functional>
#include <stdexcept>
#include <string>
#include <typeinfo>
#include <utility>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "error/EmptySlot.hpp"
#include "error/errorUtil/GitResult.hpp"
#include "options/Callbacks.hpp"
#include "options/CancellationPoller.hpp"
#include "options/gitRecords.hpp"
#include "support/Failure.hpp"
#include "support/GitFixture.hpp"
#include "support/LibGit2Session.hpp"
#include "support/LogCapture.hpp"
#include "support/TestInteractor.hpp"
#include "vclink/git/LibGit2Exception.hpp"
#include "vclink/util/exception/CancelledOperationException.hpp"

namespace vclink::git
{
namespace
{

using test::failureOf;
using test::LogCapture;
using testing::ElementsAre;
using vclink::util::exception::CancelledOperationException;

struct FromCallback : std::runtime_error
{
    using std::runtime_error::runtime_error;
};

/// Members for the callbacks of walks, checkouts and fetches, which do what a test sets.
class Members
{
  public:
    int status(const char * /*path*/, unsigned /*flags*/)
    {
        ++calls;
        return body();
    }
    int notify(git_checkout_notify_t /*why*/, const char * /*path*/,
               const git_diff_file * /*baseline*/, const git_diff_file * /*target*/,
               const git_diff_file * /*workdir*/)
    {
        ++calls;
        return body();
    }
    void progress(const char * /*path*/, std::size_t /*completed*/, std::size_t /*total*/)
    {
        ++calls;
        body();
    }
    int updateTips(const char * /*name*/, const git_oid * /*from*/, const git_oid * /*to*/)
    {
        ++calls;
        return body();
    }

    std::function<int()> body = [] { return 0; };
    int calls = 0;
};

class CallbackJourney : public test::GitFixture
{
  protected:
    CallbackJourney()
    {
        test::GitRepository copy = makeRepository();
        for (const char *const name : {"one", "two", "three"})
            copy.write(name, "text");
        copy.commitAll("first");
        repository_ = acquire<git_repository>(git_repository_open, copy.path().c_str()).value();
        for (const char *const name : {"one", "two", "three"})
            copy.write(name, "changed");
    }

    GitResult<void> walk(Members &walker) const
    {
        git_status_options record = initGitRecord(git_status_options_init, 1u);
        return makeResult(git_status_foreach_ext(
            repository_.get(), &record, makeCallback<&Members::status, git_status_cb>(), &walker));
    }

    /// Puts back the changed files.
    GitResult<void> checkOut(Members &observer, bool withProgressOnly) const
    {
        git_checkout_options record = initGitRecord(git_checkout_options_init, 1u);
        record.checkout_strategy = GIT_CHECKOUT_FORCE;
        record.progress_cb = makeCallback<&Members::progress, git_checkout_progress_cb>();
        record.progress_payload = &observer;
        if (!withProgressOnly)
        {
            record.progress_cb = nullptr;
            record.notify_flags = GIT_CHECKOUT_NOTIFY_ALL;
            record.notify_cb = makeCallback<&Members::notify, git_checkout_notify_cb>();
            record.notify_payload = &observer;
        }
        return makeResult(git_checkout_head(repository_.get(), &record));
    }

    /// Fetches from the repository itself.
    GitResult<void> fetch(Members &observer) const
    {
        git_fetch_options record = initGitRecord(git_fetch_options_init, 1u);
        record.callbacks.update_tips =
            makeCallback<&Members::updateTips, decltype(record.callbacks.update_tips)>();
        record.callbacks.payload = &observer;
        git_remote_create_options remoteOptions = initGitRecord(git_remote_create_options_init, 1u);
        remoteOptions.repository = repository_.get();
        remoteOptions.name = "origin";
        // In the look-up of other names for the URL libgit2 leaks.
        remoteOptions.flags = GIT_REMOTE_CREATE_SKIP_INSTEADOF;
        const OwnedHandle<git_remote> remote =
            acquire<git_remote>(git_remote_create_with_opts, git_repository_path(repository_.get()),
                                &remoteOptions)
                .value();
        return makeResult(git_remote_fetch(remote.get(), nullptr, &record, nullptr));
    }

  private:
    const test::EmptySlot emptySlot_;
    test::LibGit2Session session_{environment()};
    OwnedHandle<git_repository> repository_;
};

/// A member's body that throws.
std::function<int()> throwing(const std::string &text)
{
    return [text]() -> int { throw FromCallback(text); };
}

/// The text of the exception from a callback with which a call ends.
std::string endOf(const GitResult<void> &result)
{
    try
    {
        result.value();
        return "no exception";
    }
    catch (const FromCallback &exception)
    {
        EXPECT_EQ(typeid(exception), typeid(FromCallback));
        EXPECT_EQ(pendingCallbackException(), nullptr);
        return exception.what();
    }
}

TEST_F(CallbackJourney, EndsWithTheExceptionItselfAndRaisesNothingOfASuccess)
{
    Members walker;
    EXPECT_NO_THROW(walk(walker).value());
    EXPECT_EQ(walker.calls, 3);
    walker.body = throwing("from the walk");
    const GitResult<void> result = walk(walker);
    EXPECT_EQ(walker.calls, 4) << "the walk was not stopped";
    EXPECT_EQ(result.error().getCode(), GIT_EUSER);
    EXPECT_EQ(endOf(result), "from the walk");
}

TEST_F(CallbackJourney, CarriesAnExceptionOfAForeignTypeAndAFailureOfLibGit2)
{
    Members walker;
    walker.body = []() -> int { throw 42; };
    EXPECT_THROW(walk(walker).value(), int);
    walker.body = []
    {
        acquire<git_repository>(git_repository_open, "/nowhere/at/all").value();
        return 0;
    };
    EXPECT_EQ(failureOf([&] { walk(walker).value(); }).code, GIT_ENOTFOUND);
}

TEST_F(CallbackJourney, OfAMembersOwnCodeEndsWithAnOrdinaryFailure)
{
    for (const int code : {-1, -7, -30, 5})
    {
        Members walker;
        walker.body = [code] { return code; };
        EXPECT_EQ(failureOf([&] { walk(walker).value(); }).code, code);
        EXPECT_EQ(pendingCallbackException(), nullptr);
        EXPECT_EQ(walker.calls, 1);
    }
}

TEST_F(CallbackJourney, TellsBothRecordsForACodeOfTheUserWithoutAnException)
{
    Members walker;
    walker.body = [] { return -7; };
    const GitResult<void> result = walk(walker);
    const LogCapture log(SeverityDiagnostic);
    EXPECT_THROW(result.value(), LibGit2Exception);
    EXPECT_THAT(log.messages(), ElementsAre("Re-throwing error from callback",
                                            testing::MatchesRegex("Throwing error .* \\(-7\\)")));
}

TEST_F(CallbackJourney, GoesThroughAWalkInsideAWalkOrEndsInTheCallback)
{
    Members inner;
    inner.body = throwing("from the inner walk");
    Members outer;
    outer.body = [this, &inner]
    {
        walk(inner).value();
        return 0;
    };
    EXPECT_EQ(endOf(walk(outer)), "from the inner walk");
    EXPECT_EQ(outer.calls, 1);
    EXPECT_EQ(inner.calls, 1);
    outer.body = [this, &inner]
    {
        EXPECT_EQ(endOf(walk(inner)), "from the inner walk");
        return 0;
    };
    EXPECT_NO_THROW(walk(outer).value());
    EXPECT_EQ(outer.calls, 4);
}

TEST_F(CallbackJourney, WaitsForTheNextCodeOfTheUserWhenAFailureIsDroppedUnlessAnotherComes)
{
    Members walker;
    for (const char *const text : {"dropped", "replaced", "later"})
    {
        walker.body = throwing(text);
        static_cast<void>(walk(walker));
        EXPECT_NE(pendingCallbackException(), nullptr);
    }
    walker.body = [] { return -7; };
    EXPECT_EQ(endOf(walk(walker)), "later");
    EXPECT_THROW(walk(walker).value(), LibGit2Exception);
}

TEST_F(CallbackJourney, WaitsWhenLibGit2AnswersWithAnotherCode)
{
    Members observer;
    observer.body = throwing("from the fetch");
    const GitResult<void> result = fetch(observer);
    ASSERT_EQ(observer.calls, 1);
    ASSERT_TRUE(result.has_error());
    ASSERT_NE(result.error().getCode(), GIT_EUSER) << "this libgit2 keeps the code";
    EXPECT_THROW(result.value(), LibGit2Exception);
    EXPECT_NE(pendingCallbackException(), nullptr);
    EXPECT_THROW(GitErrorPolicy::throwIfError(GitError(GIT_EUSER)), FromCallback);
}

TEST_F(CallbackJourney, StopsACheckout)
{
    Members observer;
    observer.body = throwing("from the checkout");
    EXPECT_EQ(endOf(checkOut(observer, false)), "from the checkout");
    EXPECT_EQ(observer.calls, 1);
}

TEST_F(CallbackJourney, DoesNotBeginInACallbackWithoutAResult)
{
    Members observer;
    observer.body = throwing("from the progress");
    EXPECT_NO_THROW(checkOut(observer, true).value());
    EXPECT_GE(observer.calls, 3);
    EXPECT_EQ(pendingCallbackException(), nullptr);

    Members walker;
    EXPECT_NO_THROW(walk(walker).value());
    EXPECT_EQ(walker.calls, 0) << "the checkout has not put the files back";
}

TEST_F(CallbackJourney, OfACancellationEndsWithItAndARetryRunsNormally)
{
    test::TestInteractor interactor;
    CancellationPoller poller(interactor);
    Members observer;
    observer.body = [&poller]
    {
        poller.throwIfCancelled();
        return 0;
    };
    interactor.cancel();
    EXPECT_THROW(checkOut(observer, false).value(), CancelledOperationException);
    EXPECT_EQ(observer.calls, 1);
    EXPECT_NO_THROW(checkOut(observer, false).value());
    EXPECT_GT(observer.calls, 2);
}

} // namespace
} // namespace vclink::git
