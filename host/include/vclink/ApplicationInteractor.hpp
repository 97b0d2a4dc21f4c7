// SPDX-License-Identifier: MIT
#pragma once

#include "vclink/ProgressReporter.hpp"
#include "vclink/Terminator.hpp"
#include "vclink_host/export.hpp"

namespace vclink
{

/// The connection of a back end to the application for one interaction. The order of the operations
/// is binding.
class VCLINK_HOST_EXPORT ApplicationInteractor
{
  public:
    ApplicationInteractor() = default;
    ApplicationInteractor(const ApplicationInteractor &) = delete;
    ApplicationInteractor &operator=(const ApplicationInteractor &) = delete;
    virtual ~ApplicationInteractor();

    /// Returns the source of cancellation, valid as long as the interactor.
    virtual Terminator &getTerminator() = 0;
    /// Returns the receiver of progress, valid as long as the interactor, or null for no progress.
    virtual ProgressReporter *getProgressReporter() = 0;
};

} // namespace vclink
