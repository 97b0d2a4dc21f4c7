// SPDX-License-Identifier: MIT
// What costs no allocation.
#include <cstddef>
#include <exception>
#include <string>
#include <utility>

#include <boost/log/core/core.hpp>
#include <gtest/gtest.h>

#include "error/errorUtil/GitErrorPolicy.hpp"
#include "error/errorUtil/callbackException.hpp"
#include "error/logging/ScopeTrace.hpp"
#include "foundation/core/diag/stacktrace_base.hpp"
#include "support/AllocationCounter.hpp"
#include "support/LogCapture.hpp"

namespace vclink::git
{
namespace
{

using test::AllocationCounter;
using test::LogCapture;

/// Logs nothing. The logger has come into being before.
class NothingEnabled
{
  public:
    NothingEnabled()
    {
        logger().set_enabled_severities(0);
    }

  private:
    LogCapture log_{0};
};

TEST(Allocations, AreNoneForADisabledSeverity)
{
    const NothingEnabled nothingEnabled;
    bool isAsked = false;
    const AllocationCounter counter;
    writeRecord(
        SeverityDiagnostic, "Throwing error ",
        [&isAsked]
        {
            isAsked = true;
            return std::string(100, 'x');
        },
        " (", -7, ")");
    EXPECT_EQ(counter.count(), 0u);
    EXPECT_FALSE(isAsked);
}

/// Opening a record would take some: Boost.Log is asked before.
TEST(Allocations, AreNoneForARecordWhileBoostLogIsSwitchedOff)
{
    const LogCapture log;
    writeRecord(SeverityDiagnostic, "The first record makes what Boost.Log keeps.");
    const auto core = boost::log::core::get();
    core->set_logging_enabled(false);
    const AllocationCounter counter;
    writeRecord(SeverityDiagnostic, "text");
    const std::size_t count = counter.count();
    core->set_logging_enabled(true);
    EXPECT_EQ(count, 0u);
    EXPECT_EQ(log.messages().size(), 1u);
}

TEST(Allocations, AreNoneForATraceThatIsDisabled)
{
    const NothingEnabled nothingEnabled;
    const AllocationCounter counter;
    {
        const ScopeTrace trace(logger(), "void traced()", "file", 1);
    }
    EXPECT_EQ(counter.count(), 0u);
}

TEST(Allocations, AreNoneForThePolicyWhenAllIsDisabledAndNothingFailed)
{
    const GitError error;
    const NothingEnabled nothingEnabled;
    const AllocationCounter counter;
    GitErrorPolicy::throwIfError(error);
    EXPECT_EQ(counter.count(), 0u);
}

TEST(Allocations, OfTheSlotHappenOnceAThread)
{
    pendingCallbackException() = nullptr;
    std::exception_ptr exception = std::make_exception_ptr(42);
    const AllocationCounter counter;
    storeCallbackException(std::move(exception));
    pendingCallbackException() = nullptr;
    EXPECT_EQ(counter.count(), 0u);
}

TEST(Allocations, AreNoneForRecordingAStack)
{
    foundation::core::diag::stacktrace_base trace;
    trace.capture(0);
    const AllocationCounter counter;
    trace.capture(0);
    const foundation::core::diag::stacktrace_base copy = trace;
    EXPECT_EQ(counter.count(), 0u);
    EXPECT_GT(copy.size(), 0u);
}

} // namespace
} // namespace vclink::git
