// SPDX-License-Identifier: MIT
#pragma once

#include <utility>

#include <unistd.h>

namespace vclink::git
{

/// Owns an open file descriptor, or none (-1).
class FileDescriptor
{
  public:
    FileDescriptor() = default;
    explicit FileDescriptor(int value) noexcept : value_(value)
    {
    }
    FileDescriptor(FileDescriptor &&other) noexcept : value_(std::exchange(other.value_, -1))
    {
    }
    FileDescriptor &operator=(FileDescriptor &&other) noexcept
    {
        std::swap(value_, other.value_);
        return *this;
    }
    ~FileDescriptor()
    {
        if (value_ >= 0)
        {
            ::close(value_);
        }
    }

    int get() const noexcept
    {
        return value_;
    }
    explicit operator bool() const noexcept
    {
        return value_ >= 0;
    }

  private:
    int value_ = -1;
};

} // namespace vclink::git
