// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

namespace vclink::git
{

/// The files that a checkout writes over and that have further names. libgit2 writes into the file
/// that is there, so that it changes under all its names, in other folders too; git makes a new
/// file for the one name.
class HardLinks
{
  public:
    /// To be called for each file before the checkout writes the first.
    /// @param path absolute; a file with one name, or no file at all, is left out
    /// @return false if its name cannot be removed
    /// @throws LibGit2Exception if the path cannot be examined
    bool note(const std::string &path);

    /// Removes the names that were noted, right before the checkout writes. The content stays under
    /// the others.
    void part() noexcept;

  private:
    std::vector<std::string> paths_;
};

} // namespace vclink::git
