// SPDX-License-Identifier: MIT
#include "computils/exception/StackTraceRecordingException.hpp"

namespace computils::exception
{

StackTraceRecordingException::StackTraceRecordingException()
{
    trace_.capture(0);
}

StackTraceRecordingException::~StackTraceRecordingException() = default;

const ustring &StackTraceRecordingException::getText() const noexcept
{
    return text_;
}

const foundation::core::diag::stacktrace_base &
StackTraceRecordingException::getStackTrace() const noexcept
{
    return trace_;
}

} // namespace computils::exception
