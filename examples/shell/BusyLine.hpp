// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>
#include <condition_variable>
#include <functional>
#include <mutex>
#include <string>
#include <thread>

#include "ProgressLine.hpp"

namespace vclink::shell
{

/// While it lives, a line on the terminal shows what is being done, and for how long: a sign of
/// life if the amount of work is unknown. Does nothing if no line is shown.
class BusyLine
{
  public:
    /// @param text what is being done
    /// @param isOver asked before each drawing, on the line's own thread; once it says yes, nothing
    ///        is drawn any more
    /// @param line outlives the object
    BusyLine(ProgressLine &line, std::string text, std::function<bool()> isOver);
    BusyLine(const BusyLine &) = delete;
    BusyLine &operator=(const BusyLine &) = delete;
    ~BusyLine();

    /// Adds what the other side reports about its progress. Any thread.
    void setDetail(const std::string &detail);

  private:
    void run();
    void draw();

    ProgressLine &line_;
    const std::string text_;
    const std::function<bool()> isOver_;
    const std::chrono::steady_clock::time_point begin_ = std::chrono::steady_clock::now();
    std::mutex mutex_;
    std::condition_variable ending_;
    std::string detail_;
    bool hasEnded_ = false;
    std::thread clock_;
};

} // namespace vclink::shell
