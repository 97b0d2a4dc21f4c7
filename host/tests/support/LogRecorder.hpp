// SPDX-License-Identifier: MIT
#pragma once

#include <memory>
#include <string>
#include <vector>

namespace vclink_host_tests
{

/// What a sink of Boost.Log sees of one record.
struct SeenRecord
{
    unsigned severity;
    std::string channel;
    std::string message;
};

/// A sink of Boost.Log's core for the object's life, which keeps what it is given.
class LogRecorder
{
  public:
    LogRecorder();
    LogRecorder(const LogRecorder &) = delete;
    LogRecorder &operator=(const LogRecorder &) = delete;
    ~LogRecorder();

    const std::vector<SeenRecord> &records() const;

  private:
    struct Impl;
    std::unique_ptr<Impl> impl_;
};

/// Switches logging off in Boost.Log's core for the object's life.
class LoggingSwitchedOff
{
  public:
    LoggingSwitchedOff();
    LoggingSwitchedOff(const LoggingSwitchedOff &) = delete;
    LoggingSwitchedOff &operator=(const LoggingSwitchedOff &) = delete;
    ~LoggingSwitchedOff();
};

} // namespace vclink_host_tests
