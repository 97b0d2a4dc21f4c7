// SPDX-License-Identifier: MIT
#pragma once

#include <atomic>
#include <map>
#include <mutex>
#include <string>

namespace foundation::core::log
{

/// The masks that the host has set by name, and the living loggers. Any thread.
class LoggerRegistry
{
  public:
    /// Returns the registry of the process. A logger calls it in its constructor, so that the
    /// registry outlives every logger with static storage.
    static LoggerRegistry &instance();

    /// Adds a logger, and sets its mask to the one of its name.
    void attach(const std::string &name, std::atomic<unsigned> &mask);
    void detach(std::atomic<unsigned> &mask) noexcept;

    void setMask(const std::string &name, unsigned mask);
    /// Returns the mask of the loggers of this name, otherwise the one that was set, otherwise 0.
    unsigned getMask(const std::string &name);

  private:
    std::mutex mutex_;
    std::map<std::string, unsigned> asked_;
    std::map<std::atomic<unsigned> *, std::string> loggers_;
};

} // namespace foundation::core::log
