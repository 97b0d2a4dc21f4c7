// SPDX-License-Identifier: MIT
#pragma once

#include <array>
#include <cstdint>
#include <string>

#include "vclink/git/export.hpp"

namespace vclink::git
{

/// A reference as a remote advertises it. A plain value, with no tie to the remote.
class VCLINK_GIT_EXPORT GitRemoteHead
{
  public:
    /// The 20 bytes of an object's name.
    using Id = std::array<unsigned char, 20>;

    /// libgit2's flag: other than 0 when it found the object in the repository here. A listing
    /// looks for none.
    std::int32_t local = 0;
    /// What the reference points at.
    Id oid = {};
    /// What it points at here, if libgit2 looked; otherwise zeros.
    Id loid = {};
    /// The reference's full name, UTF-8; "HEAD" for the remote's HEAD. The name of a tag followed
    /// by "^{}" stands for the object that the tag names.
    std::string name;
    /// The name of the reference that this one stands for, UTF-8; empty when it stands for none, or
    /// the remote does not tell.
    std::string symrefTarget;
};

} // namespace vclink::git
