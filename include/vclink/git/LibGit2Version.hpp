// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "vclink/git/export.hpp"

namespace vclink::git
{

/// The version of the libgit2 that is linked at run time. git_libgit2_version. Needs no
/// LibGit2Guard. A plain value; raises nothing but std::bad_alloc.
class VCLINK_GIT_EXPORT LibGit2Version
{
  public:
    LibGit2Version();

    int getMajor() const noexcept;
    int getMinor() const noexcept;
    int getRevision() const noexcept;
    /// The three numbers in decimal, a dot between each two.
    std::string toString() const;

  private:
    int major_;
    int minor_;
    int revision_;
};

} // namespace vclink::git
