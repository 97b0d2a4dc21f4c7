// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "vclink/git/export.hpp"

namespace vclink::git
{

/// The name of a branch. A plain value, independent of the repository.
class VCLINK_GIT_EXPORT BranchPointer
{
  public:
    /// Copies the name.
    /// @param name UTF-8
    explicit BranchPointer(const std::string &name);
    /// Moves the name.
    explicit BranchPointer(std::string &&name) noexcept;

    /// Returns the name, UTF-8. The lists of BranchManager have full names of references, its
    /// getCurrentBranch() returns a short name.
    std::string getName() const;

  private:
    std::string name_;
};

/// Returns true if the names have the same bytes.
VCLINK_GIT_EXPORT bool operator==(const BranchPointer &left, const BranchPointer &right);
VCLINK_GIT_EXPORT bool operator!=(const BranchPointer &left, const BranchPointer &right);

} // namespace vclink::git
