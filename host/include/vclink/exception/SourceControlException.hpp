// SPDX-License-Identifier: MIT
#pragma once

#include "computils/exception/StackTraceRecordingException.hpp"
#include "vclink_host/export.hpp"

namespace vclink::exception
{

/// Base of all failures of source control.
class VCLINK_HOST_EXPORT SourceControlException
    : public computils::exception::StackTraceRecordingException
{
  public:
    SourceControlException() = default;
    SourceControlException(const SourceControlException &) = default;
    SourceControlException &operator=(const SourceControlException &) = default;
    ~SourceControlException() override;
};

} // namespace vclink::exception
