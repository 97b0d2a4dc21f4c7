// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "vclink/git/export.hpp"

namespace vclink::git
{

/// The name of a branch. A plain value, with no tie to the repository.
class VCLINK_GIT_EXPORT BranchPointer
{
  public:
    /// @param name UTF-8
    explicit BranchPointer(const std::string &name);
    /// The same, without a copy.
    explicit BranchPointer(std::string &&name) noexcept;

    /// The name, UTF-8: of a list the full name of the reference, of BranchManager's
    /// getCurrentBranch() the short one.
    std::string getName() const;

  private:
    std::string name_;
};

/// Whether the names are the same bytes.
VCLINK_GIT_EXPORT bool operator==(const BranchPointer &left, const BranchPointer &right);
VCLINK_GIT_EXPORT bool operator!=(const BranchPointer &left, const BranchPointer &right);

} // namespace vclink::git
