// SPDX-License-Identifier: MIT
#pragma once

#include <cerrno>
#include <system_error>
#include <utility>

#include <unistd.h>

namespace vclink::test
{

/// Owns a descriptor.
class Descriptor
{
  public:
    /// @throws std::system_error, with these words, of a number that a failed call gave
    static Descriptor checked(int number, const char *what)
    {
        if (number < 0)
            throw std::system_error(errno, std::generic_category(), what);
        return Descriptor(number);
    }

    explicit Descriptor(int number = -1) noexcept : number_(number)
    {
    }
    Descriptor(Descriptor &&other) noexcept : number_(std::exchange(other.number_, -1))
    {
    }
    Descriptor &operator=(Descriptor &&other) noexcept
    {
        std::swap(number_, other.number_);
        return *this;
    }
    ~Descriptor()
    {
        close();
    }

    int get() const noexcept
    {
        return number_;
    }
    void close() noexcept
    {
        if (number_ >= 0)
            ::close(std::exchange(number_, -1));
    }

  private:
    int number_;
};

} // namespace vclink::test
