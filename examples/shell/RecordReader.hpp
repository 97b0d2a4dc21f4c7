// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <memory>
#include <string>

namespace vclink::shell
{

/// While it lives, reads what the library writes to its log, for what an operation does not tell
/// its caller otherwise. At most one object at a time.
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
