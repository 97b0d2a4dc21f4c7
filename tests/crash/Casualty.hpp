// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>
#include <string>
#include <vector>

#include <sys/types.h>

namespace vclink::test
{

/// A worker process that is killed while it works.
class Casualty
{
  public:
    /// A report of the worker.
    struct Report
    {
        bool isEnd;
        std::string operation;
        /// of HEAD, at the end of an operation
        std::string id;
        std::chrono::steady_clock::time_point time;
    };

    /// @throws std::system_error when the process can't be made
    explicit Casualty(const std::vector<std::string> &command);
    Casualty(const Casualty &) = delete;
    Casualty &operator=(const Casualty &) = delete;
    ~Casualty();

    /// Waits until the worker has said this many things.
    /// @return false when it has ended or is silent for a minute
    bool awaitReports(std::size_t count);
    /// Kills the worker after this time, and reads what it has said until then.
    void killAfter(std::chrono::microseconds time);

    /// What was said, in order.
    const std::vector<Report> &reports() const noexcept
    {
        return reports_;
    }
    /// The operation that was under way at the end, empty if none was.
    std::string interrupted() const;

  private:
    /// @return false when there is nothing more to read
    bool read();
    void takeLines();
    void kill() noexcept;

    pid_t process_ = -1;
    int output_ = -1;
    std::string unread_;
    std::vector<Report> reports_;
};

} // namespace vclink::test
