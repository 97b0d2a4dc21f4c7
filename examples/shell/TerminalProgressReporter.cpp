// SPDX-License-Identifier: MIT
#include "TerminalProgressReporter.hpp"

namespace vclink::shell
{
namespace
{

constexpr std::chrono::milliseconds drawingPause{50};

} // namespace

TerminalProgressReporter::TerminalProgressReporter(ProgressLine &line, Activity &activity)
    : line_(line), activity_(activity)
{
}

void TerminalProgressReporter::setProgress(double fraction)
{
    activity_.note();
    hasBegun_.store(true);
    fraction_ = fraction;
}

void TerminalProgressReporter::setProgressMessage(const ustring &message)
{
    activity_.note();
    const auto now = std::chrono::steady_clock::now();
    const bool isLast = fraction_ >= 1;
    if (line_.isShown() && (isLast || now >= nextDrawing_))
    {
        nextDrawing_ = now + drawingPause;
        line_.draw(fraction_, message);
    }
}

bool TerminalProgressReporter::hasBegun() const noexcept
{
    return hasBegun_.load();
}

} // namespace vclink::shell
