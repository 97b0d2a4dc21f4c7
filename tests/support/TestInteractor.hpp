// SPDX-License-Identifier: MIT
#pragma once

#include <vector>

#include "fl/ustring.hpp"
#include "vclink/ApplicationInteractor.hpp"
#include "vclink/ProgressReporter.hpp"
#include "vclink/Terminator.hpp"

namespace vclink::test
{

/// Remembers all progress, in order.
class RecordingProgressReporter : public ProgressReporter
{
  public:
    void setProgress(double fraction) override;
    void setProgressMessage(const ustring &message) override;

    std::vector<double> fractions;
    std::vector<ustring> messages;
};

/// An application that can be cancelled and remembers its progress.
class TestInteractor : public ApplicationInteractor
{
  public:
    Terminator &getTerminator() override;
    ProgressReporter *getProgressReporter() override;

    /// Asks every poller attached to the terminator to cancel. Any thread.
    void cancel();

    Terminator terminator;
    RecordingProgressReporter progress;
};

} // namespace vclink::test
