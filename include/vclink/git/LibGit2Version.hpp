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

    /// 1 of 1.5.0.
    int getMajor() const noexcept;
    /// 5 of 1.5.0.
    int getMinor() const noexcept;
    /// 0 of 1.5.0.
    int getRevision() const noexcept;
    /// The three numbers in decimal, a dot between each two.
    std::string toString() const;

  private:
    int major_;
    int minor_;
    int revision_;
};

} // namespace vclink::git
