// SPDX-License-Identifier: MIT
#include "error/errorUtil/GitErrorPolicy.hpp"

#include <exception>
#include <stdexcept>
#include <string>
#include <typeinfo>
#include <vector>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "error/HermeticLibGit2.hpp"
#include "error/errorUtil/callbackException.hpp"
#include "error/errorUtil/libgit2Errors.hpp"
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

/// The address of the exception object that a pointer holds.
const void *objectOf(const std::exception_ptr &pointer)
{
    try
    {
        std::rethrow_exception(pointer);
    }
    catch (const std::exception &exception)
    {
        return &exception;
    }
}

class ThrowIfError : public testing::Test
{
  protected:
    ThrowIfError()
    {
        pendingCallbackException() = nullptr;
    }
    ~ThrowIfError() override
    {
        pendingCallbackException() = nullptr;
    }
    HermeticLibGit2 libgit2;
};

TEST_F(ThrowIfError, ReturnsForCodeZeroAndLeavesItsRecord)
{
    const LogCapture log(SeverityDiagnostic);
    git_error_set_str(GIT_ERROR_NET, "stale");
    EXPECT_NO_THROW(GitErrorPolicy::throwIfError(GitError(0)));
    EXPECT_THAT(log.records(), ElementsAre(isRecord(0x08, "Throwing error  (0)")));
}

TEST_F(ThrowIfError, ThrowsTheFailureAfterItsRecord)
{
    const GitError error = makeError(-3, GIT_ERROR_REFERENCE,
                                     "no such r\xC3\xA9"
                                     "ference");
    const LogCapture log(SeverityDiagnostic);
    EXPECT_EQ(failureOf([&] { GitErrorPolicy::throwIfError(error); }),
              (Failure{-3, GIT_ERROR_REFERENCE, "no such r\u00E9ference"}));
    EXPECT_THAT(log.messages(), ElementsAre("Throwing error no such r\xC3\xA9"
                                            "ference (-3)"));
}

TEST_F(ThrowIfError, ShowsNoTextWhereLibGit2ToldNone)
{
    git_error_clear();
    const GitError error(-5);
    const LogCapture log(SeverityDiagnostic);
    EXPECT_THROW(GitErrorPolicy::throwIfError(error), LibGit2Exception);
    EXPECT_THAT(log.messages(), ElementsAre("Throwing error  (-5)"));
}

TEST_F(ThrowIfError, ThrowsForAPositiveCode)
{
    const LogCapture log(SeverityDiagnostic);
    EXPECT_THROW(GitErrorPolicy::throwIfError(makeError(1, GIT_ERROR_CALLBACK, "stopped")),
                 LibGit2Exception);
    EXPECT_THAT(log.messages(), ElementsAre("Throwing error stopped (1)"));
}

TEST_F(ThrowIfError, TracesItsEntryAndItsThrow)
{
    const GitError error = makeError(-3, GIT_ERROR_REFERENCE, "gone");
    const LogCapture log;
    EXPECT_THROW(GitErrorPolicy::throwIfError(error), LibGit2Exception);
    EXPECT_THAT(log.records(), ElementsAre(isRecord(0x20, throwIfErrorSignature),
                                           isRecord(0x08, "Throwing error gone (-3)"),
                                           isRecord(0x40, throwIfErrorSignature + " [throw]")));
}

TEST_F(ThrowIfError, TracesItsReturn)
{
    const LogCapture log;
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
    catch (const std::exception &exception)
    {
        EXPECT_EQ(typeid(exception), typeid(FromCallback));
        EXPECT_EQ(&exception, objectOf(stored));
        EXPECT_STREQ(exception.what(), "from the callback");
    }
    EXPECT_EQ(pendingCallbackException(), nullptr);
    EXPECT_THAT(log.records(), ElementsAre(isRecord(0x20, throwIfErrorSignature),
                                           isRecord(0x08, "Re-throwing error from callback"),
                                           isRecord(0x40, throwIfErrorSignature + " [throw]")));
}

TEST_F(ThrowIfError, RethrowsAnExceptionOfAnyType)
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

TEST_F(ThrowIfError, RethrowsAnExceptionOnceOnly)
{
    const GitError error = makeError(GIT_EUSER, GIT_ERROR_CALLBACK, "stopped");
    storeCallbackException(std::make_exception_ptr(FromCallback("once")));
    EXPECT_THROW(GitErrorPolicy::throwIfError(error), FromCallback);
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
