// SPDX-License-Identifier: MIT
#include "ProgressLine.hpp"

#include <algorithm>
#include <cmath>
#include <iostream>

#include <sys/ioctl.h>
#include <unistd.h>

#include "fl/i18n/convert.hpp"
#include "names.hpp"

namespace vclink::shell
{
namespace
{

constexpr std::size_t barWidth = 20;
constexpr std::size_t usualColumns = 80;
constexpr const char *takeLineAway = "\r\33[K";

std::size_t countColumns()
{
    winsize size = {};
    const bool isKnown = ::ioctl(STDERR_FILENO, TIOCGWINSZ, &size) == 0 && size.ws_col > 0;
    return isKnown ? size.ws_col : usualColumns;
}

/// How many columns a character takes, or a half of one, at the most: a line that is too long could
/// not be taken away.
std::size_t widthOf(char16_t unit)
{
    constexpr char16_t firstWide = 0x1100;
    return unit < firstWide ? 1 : 2;
}

bool isSecondHalf(char16_t unit)
{
    return unit >= 0xDC00 && unit <= 0xDFFF;
}

/// The text, or three dots and its end if it needs more columns: the end of a path says more than
/// its beginning.
ustring fit(const ustring &text, std::size_t columns)
{
    const ustring dots = u"...";
    std::size_t width = 0;
    std::size_t start = text.size();
    std::size_t startAfterDots = text.size();
    while (start > 0 && width + widthOf(text[start - 1]) <= columns)
    {
        --start;
        width += widthOf(text[start]);
        if (width + dots.size() <= columns)
        {
            startAfterDots = start;
        }
    }
    if (start == 0)
    {
        return text;
    }
    while (startAfterDots < text.size() && isSecondHalf(text[startAfterDots]))
    {
        ++startAfterDots;
    }
    return columns < dots.size() ? ustring() : dots + text.substr(startAfterDots);
}

} // namespace

std::string composeProgress(double fraction, const ustring &message, std::size_t columns)
{
    const double done = std::clamp(fraction, 0.0, 1.0);
    const auto filled = static_cast<std::size_t>(done * barWidth);
    const std::string percent = std::to_string(static_cast<int>(done * 100)) + "% ";
    std::string text = '[' + std::string(filled, '#') + std::string(barWidth - filled, '-') + "] " +
                       std::string(5 - percent.size(), ' ') + percent;
    if (text.size() > columns)
    {
        text = percent.size() > columns ? std::string() : percent;
    }
    const ustring line = fl::i18n::utf8_to_ustring(escapeDirections(makePrintableLine(message)));
    return text + fl::i18n::ustring_to_utf8(fit(line, columns - text.size()));
}

ProgressLine::ProgressLine(bool isShown) : isShown_(isShown)
{
}

ProgressLine::~ProgressLine()
{
    clear();
}

void ProgressLine::draw(double fraction, const ustring &message)
{
    if (isShown_)
    {
        // In the last column some terminals begin a new line.
        show(composeProgress(fraction, message, countColumns() - 1));
    }
}

void ProgressLine::drawText(const std::string &text)
{
    if (isShown_)
    {
        const std::string line = makePrintableLine(fl::i18n::utf8_to_ustring(text));
        const ustring whole = fl::i18n::utf8_to_ustring(escapeDirections(line));
        show(fl::i18n::ustring_to_utf8(fit(whole, countColumns() - 1)));
    }
}

void ProgressLine::show(const std::string &text)
{
    const std::lock_guard<std::mutex> lock(mutex_);
    if (!hasEnded_)
    {
        std::cerr << takeLineAway + text << std::flush;
        isDrawn_ = true;
    }
}

void ProgressLine::clear()
{
    const std::lock_guard<std::mutex> lock(mutex_);
    takeAway();
}

void ProgressLine::end()
{
    const std::lock_guard<std::mutex> lock(mutex_);
    hasEnded_ = true;
    takeAway();
}

void ProgressLine::clearFor(const std::function<void()> &write)
{
    const std::lock_guard<std::mutex> lock(mutex_);
    takeAway();
    write();
}

void ProgressLine::takeAway()
{
    if (isDrawn_)
    {
        std::cerr << takeLineAway << std::flush;
        isDrawn_ = false;
    }
}

} // namespace vclink::shell
