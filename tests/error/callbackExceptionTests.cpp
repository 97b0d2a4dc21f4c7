// SPDX-License-Identifier: MIT
#include "error/errorUtil/callbackException.hpp"

#include <exception>
#include <memory>
#include <stdexcept>
#include <string>
#include <utility>
#include <vector>

#include <boost/exception/diagnostic_information.hpp>
#include <git2/errors.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "error/logging/severity.hpp"
#include "fl/i18n/convert.hpp"
#include "support/LogCapture.hpp"
#include "vclink/git/GitException.hpp"
#include "vclink/git/messageIdentifiers.hpp"
#include "vclink/util/exception/CancelledOperationException.hpp"

namespace vclink::git
{
namespace
{

using test::LogCapture;
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
    CallbackException()
    {
        pendingCallbackException() = nullptr;
    }
    ~CallbackException() override
    {
        pendingCallbackException() = nullptr;
    }
};

TEST_F(CallbackException, HasOneSlotAThread)
{
    std::exception_ptr &slot = pendingCallbackException();
    EXPECT_EQ(slot, nullptr);
    EXPECT_EQ(&pendingCallbackException(), &slot);
}

TEST_F(CallbackException, IsMovedIntoTheSlot)
{
    std::exception_ptr exception = std::make_exception_ptr(std::runtime_error("stored"));
    const std::exception_ptr same = exception;
    storeCallbackException(std::move(exception));
    EXPECT_EQ(exception, nullptr);
    EXPECT_EQ(pendingCallbackException(), same);
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

TEST_F(CallbackException, IsReportedWithItsDiagnosticsAndThenItsStack)
{
    const LogCapture log;
    std::string diagnostics;
    std::string stack;
    try
    {
        throw CancelledOperationException();
    }
    catch (const CancelledOperationException &exception)
    {
        diagnostics = boost::current_exception_diagnostic_information(true);
        stack = fl::i18n::to_string(exception.getStackTrace().to_text());
        reportCallbackException();
    }
    const auto records = log.records();
    ASSERT_EQ(records.size(), 2u);
    EXPECT_EQ(records[0].severity, 0x10u);
    EXPECT_EQ(records[0].message, "Exception caught: " + diagnostics);
    EXPECT_EQ(records[1].severity, 0x200u);
    EXPECT_EQ(records[1].message, stack);
    EXPECT_NE(stack, "");
    EXPECT_EQ(pendingCallbackException(), nullptr);
}

TEST_F(CallbackException, IsReportedAtEachSeverityByItself)
{
    for (const unsigned severity : {0x10u, 0x200u})
    {
        const LogCapture log(severity);
        try
        {
            throw std::runtime_error("told");
        }
        catch (const std::runtime_error &)
        {
            reportCallbackException();
        }
        const auto records = log.records();
        ASSERT_EQ(records.size(), 1u);
        EXPECT_EQ(records[0].severity, severity);
    }
}

TEST_F(CallbackException, ThatReportsItsStackForItsTextDoesSoBeforeItsOwnRecord)
{
    const LogCapture log;
    try
    {
        throw GitException(shared_vclink::git::HasConflicts());
    }
    catch (const GitException &)
    {
        reportCallbackException();
    }
    std::vector<unsigned> severities;
    for (const auto &record : log.records())
    {
        severities.push_back(record.severity);
    }
    EXPECT_THAT(severities, testing::ElementsAre(0x200u, 0x10u, 0x200u));
}

TEST_F(CallbackException, IsReportedNowhereWhenNothingIsEnabled)
{
    const LogCapture log(~(SeverityException | SeverityStackTrace));
    try
    {
        throw std::runtime_error("untold");
    }
    catch (const std::runtime_error &)
    {
        static_cast<void>(parkCallbackException());
    }
    EXPECT_THAT(log.messages(), IsEmpty());
    EXPECT_NE(pendingCallbackException(), nullptr);
}

} // namespace
} // namespace vclink::git
