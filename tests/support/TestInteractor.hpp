// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>
#include <functional>
#include <variant>
#include <vector>

#include "fl/ustring.hpp"
#include "vclink/ApplicationInteractor.hpp"
#include "vclink/ProgressReporter.hpp"
#include "vclink/Terminator.hpp"

namespace vclink::test
{

/// What a progress display is told: how much is done, or a message.
using ProgressCall = std::variant<double, ustring>;

/// Remembers all progress, in order.
class RecordingProgressReporter : public ProgressReporter
{
  public:
    void setProgress(double fraction) override;
    void setProgressMessage(const ustring &message) override;

    std::vector<double> fractions;
    std::vector<ustring> messages;
    /// The calls of both kinds.
    std::vector<ProgressCall> calls;
    /// If set, called at the end of each call with the call's number, 1 for the first. The caller
    /// receives what it throws.
    std::function<void(std::size_t number)> onCall;

  private:
    void remember(ProgressCall call);
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
