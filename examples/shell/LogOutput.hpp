// SPDX-License-Identifier: MIT
#pragma once

#include <memory>

namespace vclink::shell
{

class ProgressLine;

/// Shows the library's log records on standard error while it lives: one line a record, its
/// severity in brackets before its text. Lines that a record brings itself are indented, so that
/// only records begin with a bracket.
class LogOutput
{
  public:
    /// @param severities what is to be shown
    /// @param progressLine is taken away before a record; outlives the output
    LogOutput(unsigned severities, ProgressLine &progressLine);
    LogOutput(const LogOutput &) = delete;
    LogOutput &operator=(const LogOutput &) = delete;
    ~LogOutput();

  private:
    struct Impl;
    std::unique_ptr<Impl> impl_;
};

} // namespace vclink::shell
