// SPDX-License-Identifier: MIT
#pragma once

#include <atomic>
#include <map>
#include <mutex>
#include <string>

namespace foundation::core::log
{

/// The masks that the host asked for by name, and the loggers that are alive. Any thread.
class LoggerRegistry
{
  public:
    /// The registry of the process. A logger takes it in its constructor, so that it outlives
    /// every logger with static storage.
    static LoggerRegistry &instance();

    /// Adds a logger and gives its mask what was asked for under its name.
    void attach(const std::string &name, std::atomic<unsigned> &mask);
    void detach(std::atomic<unsigned> &mask) noexcept;

    void setMask(const std::string &name, unsigned mask);
    /// The bits that are set for the loggers of this name, else what was asked for, else 0.
    unsigned getMask(const std::string &name);

  private:
    std::mutex mutex_;
    std::map<std::string, unsigned> asked_;
    std::map<std::atomic<unsigned> *, std::string> loggers_;
};

} // namespace foundation::core::log
