// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>

namespace vclink::test
{

/// Sets the process's working folder, until its end.
class WorkingFolder
{
  public:
    explicit WorkingFolder(const std::filesystem::path &folder)
    {
        std::filesystem::current_path(folder);
    }
    WorkingFolder(const WorkingFolder &) = delete;
    WorkingFolder &operator=(const WorkingFolder &) = delete;
    ~WorkingFolder()
    {
        std::filesystem::current_path(before_);
    }

  private:
    std::filesystem::path before_ = std::filesystem::current_path();
};

/// Leaves the process without a working folder, until its end: one that is gone.
class NoWorkingFolder
{
  public:
    /// @param parent where the folder is made that goes
    explicit NoWorkingFolder(const std::filesystem::path &parent) : gone_(makeIn(parent))
    {
        std::filesystem::remove(parent / name);
    }

  private:
    static constexpr const char *name = "gone";

    static std::filesystem::path makeIn(const std::filesystem::path &parent)
    {
        std::filesystem::create_directory(parent / name);
        return parent / name;
    }

    WorkingFolder gone_;
};

} // namespace vclink::test
