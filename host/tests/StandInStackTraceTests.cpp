// SPDX-License-Identifier: MIT
#include <stdexcept>

#include <gtest/gtest.h>

#include "computils/exception/StackTraceRecordingException.hpp"
#include "computils/exception/getStackTraceReport.hpp"
#include "fl/i18n/convert.hpp"
#include "support/AllocationCounter.hpp"
#include "vclink/exception/SourceControlException.hpp"

using computils::exception::getStackTraceReport;
using computils::exception::StackTraceRecordingException;
using foundation::core::diag::stacktrace_base;

namespace
{

[[gnu::noinline]] void raiseHere()
{
    throw vclink::exception::SourceControlException();
}

/// The lines but the first, which is where in this test the stack was taken.
ustring withoutFirstLine(const ustring &text)
{
    return text.substr(text.find(u'\n'));
}

} // namespace

TEST(StandInStackTrace, IsTakenWithoutAllocating)
{
    stacktrace_base trace;
    const vclink::test::AllocationCounter counter;
    trace.capture(0);
    EXPECT_EQ(counter.count(), 0U);
    EXPECT_GT(trace.size(), 0U);
    EXPECT_TRUE(noexcept(trace.capture(0)));
}

TEST(StandInStackTrace, IsNumberedFromTheInnermostFrame)
{
    stacktrace_base trace;
    trace.capture(0);
    const std::string text = fl::i18n::to_string(trace.to_text());
    EXPECT_EQ(text.compare(0, 3, "0# "), 0) << text;
    EXPECT_NE(text.find("\n1# "), std::string::npos) << text;
}

TEST(StandInStackTraceReport, GivesTheCallersOwnStackElsewhere)
{
    stacktrace_base own;
    own.capture(0);
    const ustring expected = withoutFirstLine(own.to_text());
    EXPECT_EQ(withoutFirstLine(getStackTraceReport()), expected);
    for (const auto &thrown : {std::make_exception_ptr(std::runtime_error("records nothing")),
                               std::make_exception_ptr(1)})
    {
        try
        {
            std::rethrow_exception(thrown);
        }
        catch (...)
        {
            EXPECT_EQ(withoutFirstLine(getStackTraceReport()), expected);
        }
    }
}

TEST(StandInStackTraceReport, GivesTheStackOfTheExceptionInHandAndLeavesItAsItIs)
{
    try
    {
        raiseHere();
        FAIL() << "nothing was raised";
    }
    catch (const StackTraceRecordingException &exception)
    {
        const std::exception_ptr before = std::current_exception();
        EXPECT_EQ(getStackTraceReport(), exception.getStackTrace().to_text());
        EXPECT_EQ(std::current_exception(), before);
        EXPECT_THROW(throw, vclink::exception::SourceControlException);
        EXPECT_GT(exception.getStackTrace().size(), 0U);
    }
    EXPECT_EQ(std::current_exception(), nullptr);
}
