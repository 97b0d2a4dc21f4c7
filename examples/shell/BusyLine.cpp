// SPDX-License-Identifier: MIT
#include "BusyLine.hpp"

#include <utility>

namespace vclink::shell
{
namespace
{

/// "0:07", "61:40".
std::string describe(std::chrono::seconds time)
{
    const auto seconds = std::to_string(time.count() % 60);
    return std::to_string(time.count() / 60) + (seconds.size() == 1 ? ":0" : ":") + seconds;
}

} // namespace

BusyLine::BusyLine(ProgressLine &line, std::string text, std::function<bool()> isOver)
    : line_(line), text_(std::move(text)), isOver_(std::move(isOver))
{
    if (line_.isShown())
    {
        clock_ = std::thread([this] { run(); });
    }
}

BusyLine::~BusyLine()
{
    if (clock_.joinable())
    {
        {
            const std::lock_guard<std::mutex> lock(mutex_);
            hasEnded_ = true;
        }
        ending_.notify_one();
        clock_.join();
        line_.clear();
    }
}

void BusyLine::setDetail(const std::string &detail)
{
    const std::lock_guard<std::mutex> lock(mutex_);
    detail_ = detail;
}

void BusyLine::run()
{
    std::unique_lock<std::mutex> lock(mutex_);
    do
    {
        draw();
    } while (!ending_.wait_for(lock, std::chrono::seconds(1), [this] { return hasEnded_; }));
}

void BusyLine::draw()
{
    if (!isOver_())
    {
        const auto time = std::chrono::duration_cast<std::chrono::seconds>(
            std::chrono::steady_clock::now() - begin_);
        line_.drawText(text_ + ' ' + describe(time) + (detail_.empty() ? "" : "  " + detail_));
    }
}

} // namespace vclink::shell
