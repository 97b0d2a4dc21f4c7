// SPDX-License-Identifier: MIT
#pragma once

#include <atomic>
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
    /// Whether files are being written, or have been. Any thread.
    bool hasBegun() const noexcept;

  private:
    ProgressLine &line_;
    Activity &activity_;
    std::atomic<bool> hasBegun_{false};
    double fraction_ = 0;
    std::chrono::steady_clock::time_point nextDrawing_{};
};

} // namespace vclink::shell
