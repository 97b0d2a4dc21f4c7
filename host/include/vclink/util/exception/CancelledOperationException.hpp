// SPDX-License-Identifier: MIT
#pragma once

#include "computils/exception/StackTraceRecordingException.hpp"
#include "vclink_host/export.hpp"

namespace vclink::util::exception
{

/// The user cancelled.
class VCLINK_HOST_EXPORT CancelledOperationException
    : public computils::exception::StackTraceRecordingException
{
  public:
    CancelledOperationException() = default;
    CancelledOperationException(const CancelledOperationException &) = default;
    CancelledOperationException &operator=(const CancelledOperationException &) = default;
    ~CancelledOperationException() override;

    /// Returns "The operation was cancelled."
    const char *what() const noexcept override;
};

} // namespace vclink::util::exception
