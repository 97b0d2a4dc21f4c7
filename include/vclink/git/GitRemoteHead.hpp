// SPDX-License-Identifier: MIT
#pragma once

#include <array>
#include <cstdint>
#include <string>

#include "vclink/git/export.hpp"

namespace vclink::git
{

/// A reference as a remote advertises it. A plain value, independent of the remote.
class VCLINK_GIT_EXPORT GitRemoteHead
{
  public:
    /// The 20 bytes of an object's id.
    using Id = std::array<unsigned char, 20>;

    /// libgit2's flag: not 0 if libgit2 found the object in the local repository. A listing does
    /// not look for it.
    std::int32_t local = 0;
    /// The object that the reference points to.
    Id oid = {};
    /// The object that it points to in the local repository, if libgit2 looked. Otherwise zeros.
    Id loid = {};
    /// The reference's full name, UTF-8. "HEAD" for the remote's HEAD. The name of a tag with "^{}"
    /// appended means the object that the tag names.
    std::string name;
    /// The target of a symbolic reference, UTF-8. Empty if the reference is not symbolic, or if the
    /// remote does not report the target.
    std::string symrefTarget;
};

} // namespace vclink::git
