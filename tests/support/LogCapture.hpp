// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <memory>
#include <string>
#include <vector>

namespace vclink::test
{

/// A record as it reached the sinks.
struct LogRecord
{
    unsigned severity = 0;
    std::string channel;
    std::string message;
};

/// Enables severities of one logger and collects its records, in the order in which they came, from
/// all threads. At its end the logger has the severities that it had before. While one lives,
/// Boost.Log has a sink and writes nothing to the terminal.
class LogCapture
{
  public:
    static constexpr unsigned allSeverities = 0xFFFFFFFFu;

    explicit LogCapture(unsigned severities = allSeverities,
                        const std::string &logger = "vclink::git");
    LogCapture(const LogCapture &) = delete;
    LogCapture &operator=(const LogCapture &) = delete;
    ~LogCapture();

    /// What came so far. May be called while other threads write.
    std::vector<LogRecord> records() const;
    /// The texts of what came so far; with `severity`, of the records that have it only.
    std::vector<std::string> messages(unsigned severity = allSeverities) const;
    void clear();
    /// Called for each record from now on, after it was collected, on the thread that wrote it. Set
    /// it before other threads write.
    void onRecord(std::function<void(const LogRecord &record)> told);

  private:
    struct Impl;
    std::unique_ptr<Impl> impl_;
};

} // namespace vclink::test
