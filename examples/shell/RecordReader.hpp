// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <memory>
#include <string>

namespace vclink::shell
{

/// While it lives, reads the records of the library's log, for results that an operation reports
/// nowhere else. At most one object at a time.
class RecordReader
{
  public:
    /// @param severities of the records to read; enabled while the object lives
    /// @param take called with the text of each, on the thread that writes it
    RecordReader(unsigned severities, std::function<void(const std::string &)> take);
    RecordReader(const RecordReader &) = delete;
    RecordReader &operator=(const RecordReader &) = delete;
    ~RecordReader();

  private:
    struct Impl;
    std::unique_ptr<Impl> impl_;
};

} // namespace vclink::shell
