// SPDX-License-Identifier: MIT
#pragma once

#include <utility>

#include "hostTools.hpp"
#include "vclink/ApplicationInteractor.hpp"
#include "vclink/Terminator.hpp"

namespace vclink::desktop
{

/// The person in front of the window, as one operation sees them. Each operation has a new one: a
/// request to cancel that came too late would stop the next operation otherwise.
class Interactor : public ApplicationInteractor
{
  public:
    explicit Interactor(host_tools::ThrottledProgress::Show show) : progress_(std::move(show))
    {
    }

    Terminator &getTerminator() override
    {
        return terminator_;
    }
    ProgressReporter *getProgressReporter() override
    {
        return &progress_;
    }

    /// Whether files are being written, which can't be cancelled. Any thread.
    bool isWriting() const noexcept
    {
        return progress_.hasBegun();
    }

  private:
    Terminator terminator_;
    host_tools::ThrottledProgress progress_;
};

} // namespace vclink::desktop
