// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "vclink/git/export.hpp"

namespace vclink::git
{

/// What a new branch is to be. A plain value.
class VCLINK_GIT_EXPORT BranchParameters
{
  public:
    /// @param name the branch's short name, UTF-8
    /// @param startPoint the name of a reference that points at a commit itself, UTF-8
    BranchParameters(const std::string &name, const std::string &startPoint);

    /// The branch's short name.
    std::string getName() const;
    /// The name of the reference that it begins at.
    std::string getStartPoint() const;

  private:
    std::string name_;
    std::string startPoint_;
};

} // namespace vclink::git
