// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>

#include "Activity.hpp"
#include "ProgressLine.hpp"
#include "fl/ustring.hpp"
#include "vclink/ProgressReporter.hpp"

namespace vclink::shell
{

/// Draws progress on a line, at most twenty times a second, and its end in any case.
class TerminalProgressReporter : public ProgressReporter
{
  public:
    /// @param activity is told of every report
    /// @param line, activity outlive the reporter
    TerminalProgressReporter(ProgressLine &line, Activity &activity);

    void setProgress(double fraction) override;
    void setProgressMessage(const ustring &message) override;

  private:
    ProgressLine &line_;
    Activity &activity_;
    double fraction_ = 0;
    std::chrono::steady_clock::time_point nextDrawing_{};
};

} // namespace vclink::shell
