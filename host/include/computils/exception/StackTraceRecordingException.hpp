// SPDX-License-Identifier: MIT
#pragma once

#include <exception>

#include "fl/ustring.hpp"
#include "foundation/core/diag/stacktrace_base.hpp"
#include "vclink_host/export.hpp"

namespace computils::exception
{

/// Records the stack of the thread that creates it. The frames are inline, and are copied with the
/// object.
class VCLINK_HOST_EXPORT StackTraceRecordingException : public std::exception
{
  public:
    StackTraceRecordingException();
    StackTraceRecordingException(const StackTraceRecordingException &) = default;
    StackTraceRecordingException &operator=(const StackTraceRecordingException &) = default;
    ~StackTraceRecordingException() override;

    /// A text for the report; empty unless a derived class sets it.
    const ustring &getText() const noexcept;
    const foundation::core::diag::stacktrace_base &getStackTrace() const noexcept;

  private:
    ustring text_;
    foundation::core::diag::stacktrace_base trace_;
};

} // namespace computils::exception
