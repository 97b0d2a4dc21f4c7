// SPDX-License-Identifier: MIT
#include <algorithm>
#include <cstdint>
#include <memory>
#include <optional>

#include <gtest/gtest.h>

#include "computils/exception/StackTraceRecordingException.hpp"
#include "computils/exception/getStackTraceReport.hpp"
#include "foundation/core/diag/stacktrace_base.hpp"
#include "vclink/exception/SourceControlException.hpp"

namespace
{

using computils::exception::StackTraceRecordingException;
using foundation::core::diag::stacktrace_base;

static_assert(stacktrace_base::capacity == 128 && sizeof(stacktrace_base) >= 128 * sizeof(void *) &&
              sizeof(StackTraceRecordingException) >= sizeof(stacktrace_base));

constexpr std::uintptr_t longestFunction = 4096;

const void *returnAddress = nullptr;

[[gnu::noinline]] void raiseHere()
{
    returnAddress = __builtin_return_address(0);
    throw vclink::exception::SourceControlException();
}

/// The index of the frame that continues at the address.
std::optional<std::size_t> findFrame(const stacktrace_base &trace, const void *address)
{
    for (std::size_t index = 0; index < trace.size(); ++index)
    {
        if (trace.frame(index) == address)
            return index;
    }
    return std::nullopt;
}

[[gnu::noinline]] stacktrace_base captureAtDepth(int depth)
{
    stacktrace_base trace;
    if (depth > 0)
        trace = captureAtDepth(depth - 1);
    else
        trace.capture(0);
    return trace;
}

} // namespace

TEST(StackTrace, HoldsTheFramesOfTheRaisingCode)
{
    try
    {
        raiseHere();
        FAIL() << "nothing was raised";
    }
    catch (const StackTraceRecordingException &exception)
    {
        const stacktrace_base &trace = exception.getStackTrace();
        const auto caller = findFrame(trace, returnAddress);
        ASSERT_TRUE(caller.has_value());
        ASSERT_GT(*caller, 0U);
        // The frame below the caller's is in the function that threw.
        const auto inside = reinterpret_cast<std::uintptr_t>(trace.frame(*caller - 1));
        const auto begin = reinterpret_cast<std::uintptr_t>(&raiseHere);
        EXPECT_TRUE(inside > begin && inside - begin < longestFunction);
    }
}

TEST(StackTrace, IsCopiedWithItsExceptionWhichHasNoTextOfItsOwn)
{
    const StackTraceRecordingException exception;
    const auto copy = std::make_unique<StackTraceRecordingException>(exception);
    const stacktrace_base &original = exception.getStackTrace();
    ASSERT_GT(original.size(), 0U);
    ASSERT_EQ(copy->getStackTrace().size(), original.size());
    for (std::size_t index = 0; index < original.size(); ++index)
        EXPECT_EQ(copy->getStackTrace().frame(index), original.frame(index));
    EXPECT_EQ(exception.getText(), ustring());
}

TEST(StackTrace, LeavesOutWhatIsDeeperThanItsCapacity)
{
    EXPECT_EQ(captureAtDepth(200).size(), stacktrace_base::capacity);
    EXPECT_LT(captureAtDepth(1).size(), stacktrace_base::capacity);
}

TEST(StackTrace, SkipsTheInnermostFramesOnRequest)
{
    stacktrace_base whole;
    stacktrace_base rest;
    whole.capture(0);
    rest.capture(1);
    ASSERT_GT(whole.size(), 1U);
    ASSERT_EQ(rest.size(), whole.size() - 1);
    EXPECT_EQ(rest.frame(0), whole.frame(1));
}

TEST(StackTrace, IsEmptyBeforeItIsTakenAndThenHasALineForEachFrame)
{
    stacktrace_base trace;
    EXPECT_EQ(trace.size(), 0U);
    EXPECT_EQ(trace.to_text(), ustring());
    trace.capture(0);
    const ustring text = trace.to_text();
    EXPECT_EQ(static_cast<std::size_t>(std::count(text.begin(), text.end(), u'\n')) + 1,
              trace.size());
}

TEST(StackTrace, IsReportedOutsideAndInsideAHandler)
{
    EXPECT_FALSE(computils::exception::getStackTraceReport().empty());
    try
    {
        raiseHere();
    }
    catch (const StackTraceRecordingException &)
    {
        EXPECT_FALSE(computils::exception::getStackTraceReport().empty());
    }
}
