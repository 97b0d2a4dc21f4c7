// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <string>

namespace vclink::test
{

/// A new, empty folder in the system's temporary folder, which every user may enter (mode 0755). It
/// is removed with all it holds at the end, unreadable folders included.
class TemporaryFolder
{
  public:
    /// @throws std::system_error when the folder can't be made
    TemporaryFolder();
    TemporaryFolder(const TemporaryFolder &) = delete;
    TemporaryFolder &operator=(const TemporaryFolder &) = delete;
    ~TemporaryFolder();

    /// Absolute and free of symbolic links.
    const std::filesystem::path &path() const noexcept
    {
        return path_;
    }
    /// The path of an entry; the entry need not exist.
    std::filesystem::path operator/(const std::string &name) const
    {
        return path_ / name;
    }

  private:
    std::filesystem::path path_;
};

} // namespace vclink::test
