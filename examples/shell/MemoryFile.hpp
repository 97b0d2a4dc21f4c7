// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <string_view>

namespace vclink::shell
{

/// A file in memory, for what a program reads or writes.
class MemoryFile
{
  public:
    explicit MemoryFile(std::string_view bytes = {});
    MemoryFile(const MemoryFile &) = delete;
    MemoryFile &operator=(const MemoryFile &) = delete;
    ~MemoryFile();

    int descriptor() const noexcept;
    /// Whether it was made, and has all the bytes.
    bool isComplete() const noexcept;
    /// Lets the next program read from the beginning.
    void rewind() const noexcept;
    std::string read() const;

  private:
    int descriptor_;
    bool isComplete_ = false;
};

} // namespace vclink::shell
