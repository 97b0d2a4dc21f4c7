// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <string>

namespace vclink::test
{

/// Small programs that a test writes into a folder and has run.
class Scripts
{
  public:
    /// @param folder is made where it is missing
    explicit Scripts(std::filesystem::path folder);

    /// A new program of the shell.
    /// @return its path
    std::string shell(const std::string &body);

    /// A new file.
    /// @return its path
    std::string file(const std::string &bytes, unsigned mode = 0644);

    /// A new named pipe.
    /// @return its path
    std::string pipe();

    const std::filesystem::path &folder() const noexcept
    {
        return folder_;
    }

  private:
    std::string newPath();

    std::filesystem::path folder_;
    int count_ = 0;
};

} // namespace vclink::test
