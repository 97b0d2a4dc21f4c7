// SPDX-License-Identifier: MIT
#include "error/errorUtil/GitErrorPolicy.hpp"

#include <exception>
#include <stdexcept>
#include <string>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "error/EmptySlot.hpp"
#include "error/HermeticLibGit2.hpp"
#include "error/errorUtil/callbackException.hpp"
#include "error/logging/severity.hpp"
#include "error/makeError.hpp"
#include "support/Failure.hpp"
#include "support/LogCapture.hpp"
#include "support/isRecord.hpp"
#include "vclink/git/LibGit2Exception.hpp"

namespace vclink::git
{
namespace
{

using test::Failure;
using test::failureOf;
using test::HermeticLibGit2;
using test::isRecord;
using test::LogCapture;
using test::makeError;
using testing::ElementsAre;
using testing::IsEmpty;

const std::string throwIfErrorSignature =
    "static void vclink::git::GitErrorPolicy::throwIfError(const vclink::git::GitError&)";

struct FromCallback : std::runtime_error
{
    using std::runtime_error::runtime_error;
};

class ThrowIfError : public testing::Test
{
  protected:
    const test::EmptySlot emptySlot;
    HermeticLibGit2 libgit2;
};

TEST_F(ThrowIfError, ThrowsTheFailureOfEachCodeButZeroAfterItsRecord)
{
    const struct
    {
        Failure failure;
        const char *record;
    } rows[] = {
        {{-3, GIT_ERROR_REFERENCE, "no such r\u00E9ference"},
         "Throwing error no such r\u00E9ference (-3)"},
        {{1, GIT_ERROR_CALLBACK, "stopped"}, "Throwing error stopped (1)"},
        {{0, GIT_ERROR_NET, "stale"}, "Throwing error  (0)"},
    };
    for (const auto &[failure, record] : rows)
    {
        const GitError error = makeError(failure.code, failure.errorClass, failure.text.c_str());
        const LogCapture log(SeverityDiagnostic);
        if (failure.code == 0)
            EXPECT_NO_THROW(GitErrorPolicy::throwIfError(error));
        else
            EXPECT_EQ(failureOf([&] { GitErrorPolicy::throwIfError(error); }), failure);
        EXPECT_THAT(log.records(), ElementsAre(isRecord(0x08, record)));
    }
    git_error_clear();
    const LogCapture log(SeverityDiagnostic);
    EXPECT_THROW(GitErrorPolicy::throwIfError(GitError(-5)), LibGit2Exception);
    EXPECT_THAT(log.messages(), ElementsAre("Throwing error  (-5)"));
}

TEST_F(ThrowIfError, TracesItsEntryAndItsThrowOrItsReturn)
{
    LogCapture log;
    EXPECT_THROW(GitErrorPolicy::throwIfError(makeError(-3, GIT_ERROR_REFERENCE, "gone")),
                 LibGit2Exception);
    EXPECT_THAT(log.records(), ElementsAre(isRecord(0x20, throwIfErrorSignature),
                                           isRecord(0x08, "Throwing error gone (-3)"),
                                           isRecord(0x40, throwIfErrorSignature + " [throw]")));
    log.clear();
    GitErrorPolicy::throwIfError(GitError());
    EXPECT_THAT(log.records(), ElementsAre(isRecord(0x20, throwIfErrorSignature),
                                           isRecord(0x08, "Throwing error  (0)"),
                                           isRecord(0x40, throwIfErrorSignature)));
}

TEST_F(ThrowIfError, WritesNothingWhereNothingIsEnabled)
{
    const GitError error = makeError(-7, GIT_ERROR_CALLBACK, "stopped");
    const LogCapture log(0);
    EXPECT_THROW(GitErrorPolicy::throwIfError(error), LibGit2Exception);
    EXPECT_THAT(log.records(), IsEmpty());
}

TEST_F(ThrowIfError, RethrowsTheVeryObjectThatWaitsInTheSlot)
{
    const std::exception_ptr stored = std::make_exception_ptr(FromCallback("from the callback"));
    const GitError error = makeError(GIT_EUSER, GIT_ERROR_CALLBACK, "stopped");
    storeCallbackException(std::exception_ptr(stored));
    const LogCapture log;
    try
    {
        GitErrorPolicy::throwIfError(error);
        ADD_FAILURE() << "nothing was raised";
    }
    catch (const FromCallback &exception)
    {
        EXPECT_EQ(std::current_exception(), stored);
        EXPECT_STREQ(exception.what(), "from the callback");
    }
    EXPECT_EQ(pendingCallbackException(), nullptr);
    EXPECT_THAT(log.records(), ElementsAre(isRecord(0x20, throwIfErrorSignature),
                                           isRecord(0x08, "Re-throwing error from callback"),
                                           isRecord(0x40, throwIfErrorSignature + " [throw]")));
}

TEST_F(ThrowIfError, ThrowsTheOrdinaryFailureWhenTheSlotIsEmpty)
{
    const GitError error = makeError(GIT_EUSER, GIT_ERROR_CALLBACK, "stopped");
    const LogCapture log(SeverityDiagnostic);
    EXPECT_EQ(failureOf([&] { GitErrorPolicy::throwIfError(error); }),
              (Failure{-7, GIT_ERROR_CALLBACK, "stopped"}));
    EXPECT_THAT(log.messages(),
                ElementsAre("Re-throwing error from callback", "Throwing error stopped (-7)"));
}

TEST_F(ThrowIfError, RethrowsAnExceptionOfAnyTypeOnceOnly)
{
    const GitError error = makeError(GIT_EUSER, GIT_ERROR_CALLBACK, "stopped");
    storeCallbackException(std::make_exception_ptr(42));
    try
    {
        GitErrorPolicy::throwIfError(error);
        ADD_FAILURE() << "nothing was raised";
    }
    catch (int number)
    {
        EXPECT_EQ(number, 42);
    }
    EXPECT_EQ(pendingCallbackException(), nullptr);
    EXPECT_THROW(GitErrorPolicy::throwIfError(error), LibGit2Exception);
}

TEST_F(ThrowIfError, LeavesTheSlotAloneForEveryOtherCode)
{
    storeCallbackException(std::make_exception_ptr(FromCallback("kept")));
    EXPECT_NO_THROW(GitErrorPolicy::throwIfError(GitError(0)));
    for (const int code : {-1, -3, -30, 1, 7})
    {
        EXPECT_THROW(GitErrorPolicy::throwIfError(makeError(code, GIT_ERROR_NET, "other")),
                     LibGit2Exception);
        EXPECT_NE(pendingCallbackException(), nullptr) << code;
    }
    EXPECT_THROW(GitErrorPolicy::throwIfError(GitError(GIT_EUSER)), FromCallback);
}

} // namespace
} // namespace vclink::git
