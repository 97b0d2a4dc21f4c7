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

/// Members for the callbacks of walks, checkouts and fetches, which do what a test tells them.
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
        pendingCallbackException() = nullptr;
        test::GitRepository copy = makeRepository();
        for (const char *const name : {"one", "two", "three"})
        {
            copy.write(name, "text");
        }
        copy.commitAll("first");
        repository_ = acquire<git_repository>(git_repository_open, copy.path().c_str()).value();
        copy.write("one", "changed");
        copy.write("two", "changed");
        copy.write("three", "changed");
    }
    ~CallbackJourney() override
    {
        pendingCallbackException() = nullptr;
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
    test::LibGit2Session session_{environment()};
    OwnedHandle<git_repository> repository_;
};

TEST_F(CallbackJourney, EndsWithTheExceptionItself)
{
    Members walker;
    walker.body = []() -> int { throw FromCallback("from the walk"); };
    const GitResult<void> result = walk(walker);
    EXPECT_EQ(walker.calls, 1) << "the walk was not stopped";
    EXPECT_EQ(result.error().getCode(), GIT_EUSER);
    try
    {
        result.value();
        ADD_FAILURE() << "nothing was raised";
    }
    catch (const std::exception &exception)
    {
        EXPECT_EQ(typeid(exception), typeid(FromCallback));
        EXPECT_STREQ(exception.what(), "from the walk");
    }
    EXPECT_EQ(pendingCallbackException(), nullptr);
}

TEST_F(CallbackJourney, CarriesAnExceptionOfAForeignType)
{
    Members walker;
    walker.body = []() -> int { throw 42; };
    try
    {
        walk(walker).value();
        ADD_FAILURE() << "nothing was raised";
    }
    catch (int number)
    {
        EXPECT_EQ(number, 42);
    }
}

TEST_F(CallbackJourney, OfASuccessRaisesNothing)
{
    Members walker;
    EXPECT_NO_THROW(walk(walker).value());
    EXPECT_EQ(walker.calls, 3);
}

/// Expects that a walk whose member answers with `code` ends with an ordinary failure of that code.
void expectOrdinaryFailure(const GitResult<void> &result, int code)
{
    EXPECT_EQ(pendingCallbackException(), nullptr);
    try
    {
        result.value();
        ADD_FAILURE() << "nothing was raised";
    }
    catch (const LibGit2Exception &exception)
    {
        EXPECT_EQ(exception.getError().getCode(), code);
    }
}

TEST_F(CallbackJourney, OfAMembersOwnCodeEndsWithAnOrdinaryFailure)
{
    for (const int code : {-1, -7, -30, 5})
    {
        Members walker;
        walker.body = [code] { return code; };
        expectOrdinaryFailure(walk(walker), code);
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

TEST_F(CallbackJourney, CarriesAFailureOfLibGit2InsideTheCallback)
{
    Members walker;
    walker.body = []
    {
        acquire<git_repository>(git_repository_open, "/nowhere/at/all").value();
        return 0;
    };
    EXPECT_EQ(failureOf([&] { walk(walker).value(); }).code, GIT_ENOTFOUND);
}

TEST_F(CallbackJourney, GoesThroughAWalkInsideAWalk)
{
    Members inner;
    inner.body = []() -> int { throw FromCallback("from the inner walk"); };
    Members outer;
    outer.body = [this, &inner]
    {
        walk(inner).value();
        return 0;
    };
    EXPECT_THROW(walk(outer).value(), FromCallback);
    EXPECT_EQ(outer.calls, 1);
    EXPECT_EQ(inner.calls, 1);
    EXPECT_EQ(pendingCallbackException(), nullptr);
}

TEST_F(CallbackJourney, MayEndInsideTheCallback)
{
    Members inner;
    inner.body = []() -> int { throw FromCallback("from the inner walk"); };
    Members outer;
    outer.body = [this, &inner]
    {
        EXPECT_THROW(walk(inner).value(), FromCallback);
        return 0;
    };
    EXPECT_NO_THROW(walk(outer).value());
    EXPECT_EQ(outer.calls, 3);
}

TEST_F(CallbackJourney, WaitsForTheNextCodeOfTheUserWhenAFailureIsDropped)
{
    Members walker;
    walker.body = []() -> int { throw FromCallback("dropped"); };
    static_cast<void>(walk(walker));
    EXPECT_NE(pendingCallbackException(), nullptr);

    Members other;
    other.body = [] { return -7; };
    EXPECT_THROW(walk(other).value(), FromCallback);
    EXPECT_THROW(walk(other).value(), LibGit2Exception);
}

TEST_F(CallbackJourney, EndsWithTheLaterOfTwoExceptions)
{
    Members walker;
    walker.body = []() -> int { throw FromCallback("first"); };
    static_cast<void>(walk(walker));
    walker.body = []() -> int { throw FromCallback("second"); };
    try
    {
        walk(walker).value();
    }
    catch (const FromCallback &exception)
    {
        EXPECT_STREQ(exception.what(), "second");
    }
    EXPECT_EQ(pendingCallbackException(), nullptr);
}

TEST_F(CallbackJourney, WaitsWhenLibGit2AnswersWithAnotherCode)
{
    Members observer;
    observer.body = []() -> int { throw FromCallback("from the fetch"); };
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
    observer.body = []() -> int { throw FromCallback("from the checkout"); };
    EXPECT_THROW(checkOut(observer, false).value(), FromCallback);
    EXPECT_EQ(observer.calls, 1);
}

TEST_F(CallbackJourney, DoesNotBeginInACallbackWithoutAResult)
{
    Members observer;
    observer.body = []() -> int { throw FromCallback("from the progress"); };
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
    try
    {
        checkOut(observer, false).value();
        ADD_FAILURE() << "nothing was raised";
    }
    catch (const std::exception &exception)
    {
        EXPECT_EQ(typeid(exception), typeid(CancelledOperationException));
    }
    EXPECT_EQ(observer.calls, 1);
    EXPECT_NO_THROW(checkOut(observer, false).value());
    EXPECT_GT(observer.calls, 2);
}

} // namespace
} // namespace vclink::git
