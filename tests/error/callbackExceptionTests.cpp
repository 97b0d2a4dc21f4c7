// SPDX-License-Identifier: MIT
#include "error/errorUtil/callbackException.hpp"

#include <exception>
#include <memory>
#include <stdexcept>
#include <string>
#include <utility>
#include <vector>

#include <git2/errors.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "error/EmptySlot.hpp"
#include "fl/i18n/convert.hpp"
#include "support/LogCapture.hpp"
#include "support/diagnosticText.hpp"
#include "support/isRecord.hpp"
#include "vclink/git/GitException.hpp"
#include "vclink/git/messageIdentifiers.hpp"
#include "vclink/util/exception/CancelledOperationException.hpp"

namespace vclink::git
{
namespace
{

using test::isRecord;
using test::LogCapture;
using testing::ElementsAre;
using testing::IsEmpty;
using vclink::util::exception::CancelledOperationException;

/// An exception that shows by its content whether it still lives.
struct Tracked
{
    std::shared_ptr<int> content;
};

class CallbackException : public testing::Test
{
  protected:
    const test::EmptySlot emptySlot;
};

TEST_F(CallbackException, IsMovedIntoTheOneSlotOfTheThread)
{
    std::exception_ptr &slot = pendingCallbackException();
    EXPECT_EQ(slot, nullptr);
    std::exception_ptr exception = std::make_exception_ptr(std::runtime_error("stored"));
    const std::exception_ptr same = exception;
    storeCallbackException(std::move(exception));
    EXPECT_EQ(exception, nullptr);
    EXPECT_EQ(slot, same);
    EXPECT_EQ(&pendingCallbackException(), &slot);
}

TEST_F(CallbackException, ReplacesAndReleasesAnEarlierOne)
{
    std::weak_ptr<int> first;
    {
        const auto content = std::make_shared<int>(1);
        first = content;
        storeCallbackException(std::make_exception_ptr(Tracked{content}));
    }
    EXPECT_FALSE(first.expired());
    const std::exception_ptr second = std::make_exception_ptr(2);
    storeCallbackException(std::exception_ptr(second));
    EXPECT_TRUE(first.expired());
    EXPECT_EQ(pendingCallbackException(), second);
}

TEST_F(CallbackException, AnswersLibGit2WithTheCodeOfTheUser)
{
    EXPECT_EQ(callbackErrorCode(), GIT_EUSER);
    EXPECT_EQ(callbackErrorCode(), -7);
    EXPECT_EQ(pendingCallbackException(), nullptr);
}

TEST_F(CallbackException, IsParkedAsItIs)
{
    try
    {
        throw 42;
    }
    catch (...)
    {
        EXPECT_EQ(parkCallbackException(), -7);
        EXPECT_EQ(pendingCallbackException(), std::current_exception());
    }
}

/// Throws the exception, and gives the records of its report.
template <class Exception>
std::vector<test::LogRecord> recordsOfReport(const Exception &exception, unsigned severities)
{
    const LogCapture log(severities);
    try
    {
        throw exception;
    }
    catch (...)
    {
        reportCallbackException();
    }
    EXPECT_EQ(pendingCallbackException(), nullptr);
    return log.records();
}

auto isOf(unsigned severity)
{
    return testing::Field(&test::LogRecord::severity, severity);
}

TEST_F(CallbackException, IsReportedWithItsDiagnosticsAndThenItsStack)
{
    const CancelledOperationException exception;
    const std::string stack = fl::i18n::to_string(exception.getStackTrace().to_text());
    EXPECT_NE(stack, "");
    EXPECT_THAT(
        recordsOfReport(exception, LogCapture::allSeverities),
        ElementsAre(isRecord(0x10u, "Exception caught: " + test::diagnosticTextOf(exception)),
                    isRecord(0x200u, stack)));
}

TEST_F(CallbackException, IsReportedAtEachSeverityByItselfAndNowhereWhenNoneIsEnabled)
{
    const std::runtime_error exception("told");
    EXPECT_THAT(recordsOfReport(exception, 0x10u), ElementsAre(isOf(0x10u)));
    EXPECT_THAT(recordsOfReport(exception, 0x200u), ElementsAre(isOf(0x200u)));
    EXPECT_THAT(recordsOfReport(exception, ~0x210u), IsEmpty());
}

TEST_F(CallbackException, ThatReportsItsStackForItsTextDoesSoBeforeItsOwnRecord)
{
    EXPECT_THAT(recordsOfReport(GitException(shared_vclink::git::HasConflicts()),
                                LogCapture::allSeverities),
                ElementsAre(isOf(0x200u), isOf(0x10u), isOf(0x200u)));
}

} // namespace
} // namespace vclink::git
