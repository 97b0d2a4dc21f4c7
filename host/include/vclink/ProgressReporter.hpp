// SPDX-License-Identifier: MIT
#pragma once

#include "fl/ustring.hpp"
#include "vclink_host/export.hpp"

namespace vclink
{

/// Shows the progress of an operation. The order of the operations is binding.
class VCLINK_HOST_EXPORT ProgressReporter
{
  public:
    ProgressReporter() = default;
    ProgressReporter(const ProgressReporter &) = delete;
    ProgressReporter &operator=(const ProgressReporter &) = delete;
    virtual ~ProgressReporter();

    /// @param fraction the completed part, 0 to 1
    virtual void setProgress(double fraction) = 0;
    virtual void setProgressMessage(const ustring &message) = 0;
};

} // namespace vclink
