// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>
#include <functional>
#include <mutex>
#include <string>

#include "fl/ustring.hpp"

namespace vclink::shell
{

/// The line on standard error that progress is drawn on, in place of what was drawn before. It is
/// taken away at the end, and has to be before anything else is written there. May be used from any
/// thread.
class ProgressLine
{
  public:
    /// @param isShown whether to draw at all
    explicit ProgressLine(bool isShown);
    ProgressLine(const ProgressLine &) = delete;
    ProgressLine &operator=(const ProgressLine &) = delete;
    ~ProgressLine();

    bool isShown() const noexcept
    {
        return isShown_;
    }
    /// @param fraction from 0 to 1
    void draw(double fraction, const ustring &message);
    /// Draws a text without a bar.
    void drawText(const std::string &text);
    /// Takes the line away, if there is one.
    void clear();
    /// As clear(). Nothing is drawn any more.
    void end();
    /// Takes the line away, if there is one, and writes something else there. Nothing is drawn
    /// until that is written.
    /// @param write must not use this line
    void clearFor(const std::function<void()> &write);

  private:
    void show(const std::string &text);
    void takeAway();

    const bool isShown_;
    std::mutex mutex_;
    bool isDrawn_ = false;
    bool hasEnded_ = false;
};

/// The line's text, which takes at most this many columns.
std::string composeProgress(double fraction, const ustring &message, std::size_t columns);

} // namespace vclink::shell
