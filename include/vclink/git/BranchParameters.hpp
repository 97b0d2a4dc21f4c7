// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "vclink/git/export.hpp"

namespace vclink::git
{

/// Name and start of a new branch. A plain value.
class VCLINK_GIT_EXPORT BranchParameters
{
  public:
    /// Creates the value.
    /// @param name the branch's short name, UTF-8
    /// @param startPoint the name of a reference to a commit, UTF-8, e.g. "HEAD" or "origin/main";
    /// not an object id, and not an annotated tag
    BranchParameters(const std::string &name, const std::string &startPoint);

    /// Returns the branch's short name.
    std::string getName() const;
    /// Returns the name of the reference at which the branch starts.
    std::string getStartPoint() const;

  private:
    std::string name_;
    std::string startPoint_;
};

} // namespace vclink::git
