// SPDX-License-Identifier: MIT
#include "computils/exception/getStackTraceReport.hpp"

#include <exception>
#include <optional>

#include "computils/exception/StackTraceRecordingException.hpp"
#include "foundation/core/diag/stacktrace_base.hpp"

namespace computils::exception
{
namespace
{

using foundation::core::diag::stacktrace_base;

/// Returns the stack that the exception in flight has recorded, if any.
std::optional<stacktrace_base> getStackOfCurrentException()
{
    const std::exception_ptr current = std::current_exception();
    if (!current)
    {
        return std::nullopt;
    }
    try
    {
        std::rethrow_exception(current);
    }
    catch (const StackTraceRecordingException &recording)
    {
        return recording.getStackTrace();
    }
    catch (...)
    {
        // Nothing is lost: the caller's handler still has this exception.
        return std::nullopt;
    }
}

} // namespace

ustring getStackTraceReport()
{
    if (const auto recorded = getStackOfCurrentException())
    {
        return recorded->to_text();
    }
    stacktrace_base own;
    own.capture(1);
    return own.to_text();
}

} // namespace computils::exception
