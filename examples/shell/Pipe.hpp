// SPDX-License-Identifier: MIT
#pragma once

namespace vclink::shell
{

/// A pipe that started programs do not inherit. Writing to it never waits.
class Pipe
{
  public:
    /// @throws std::system_error
    Pipe();
    Pipe(const Pipe &) = delete;
    Pipe &operator=(const Pipe &) = delete;
    ~Pipe();

    int readEnd() const noexcept
    {
        return readEnd_;
    }
    int writeEnd() const noexcept
    {
        return writeEnd_;
    }
    /// Lets the reader come to an end, after what was written before.
    void closeWriteEnd() noexcept;

  private:
    int readEnd_ = -1;
    int writeEnd_ = -1;
};

} // namespace vclink::shell
