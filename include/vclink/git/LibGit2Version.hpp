// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "vclink/git/export.hpp"

namespace vclink::git
{

/// The version of the libgit2 that is linked at run time. Needs no LibGit2Guard. A plain value;
/// throws only std::bad_alloc. git_libgit2_version.
class VCLINK_GIT_EXPORT LibGit2Version
{
  public:
    LibGit2Version();

    /// Returns the first number: 1 for 1.5.0.
    int getMajor() const noexcept;
    /// Returns the second number: 5 for 1.5.0.
    int getMinor() const noexcept;
    /// Returns the third number: 0 for 1.5.0.
    int getRevision() const noexcept;
    /// Returns the three numbers in decimal, separated by dots.
    std::string toString() const;

  private:
    int major_;
    int minor_;
    int revision_;
};

} // namespace vclink::git
