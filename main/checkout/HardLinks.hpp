// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

namespace vclink::git
{

/// The files that a checkout overwrites and that have other names. libgit2 writes into the existing
/// file, which then changes under all its names, even in other folders. git makes a new file for
/// the one name.
class HardLinks
{
  public:
    /// Notes a file. Call it for each file before the checkout writes the first one.
    /// @param path absolute; ignored if the file does not exist or has only one name
    /// @return false if its name cannot be removed
    /// @throws LibGit2Exception if the path cannot be examined
    bool note(const std::string &path);

    /// Removes the noted names. Call it right before the checkout writes. The content stays under
    /// the other names.
    void part() noexcept;

  private:
    std::vector<std::string> paths_;
};

} // namespace vclink::git
