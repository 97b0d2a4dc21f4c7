// SPDX-License-Identifier: MIT
#pragma once

#include <string>

namespace vclink::test
{

/// Lets one call of the file system fail, of all that this process makes while the object lives:
/// open, read, write, rename, link, mkdir, close, stat, lstat and fstat, and pread, pwrite, openat
/// and creat, which are the same. A close that fails has closed all the same, as Linux does it. A
/// program that links this has these functions replaced. For one thread, and one object at a time.
class FailingFiles
{
  public:
    /// Only counts.
    FailingFiles();
    /// @param call 1 for the first
    /// @param error the errno
    FailingFiles(int call, int error);
    /// Counts the looks at one file and nothing else: stat, lstat and access of this path.
    /// Two fail, or one where the numbers are the same.
    FailingFiles(std::string file, int first, int second, int error);
    FailingFiles(const FailingFiles &) = delete;
    FailingFiles &operator=(const FailingFiles &) = delete;
    ~FailingFiles();

    /// How many calls there were.
    int calls() const noexcept;
    /// The function that failed; empty when none did.
    std::string failed() const;

  private:
    std::string file_;
};

} // namespace vclink::test
