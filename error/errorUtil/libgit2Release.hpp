// SPDX-License-Identifier: MIT
#pragma once

#include <git2/deprecated.h> // LIBGIT2_VER_MAJOR, of which 1.8 has made another name
#include <git2/version.h>

namespace vclink::git
{

/// Returns true if the library is built with this release of libgit2 or a later one.
constexpr bool isLibGit2Since(int major, int minor) noexcept
{
    return LIBGIT2_VER_MAJOR > major || (LIBGIT2_VER_MAJOR == major && LIBGIT2_VER_MINOR >= minor);
}

} // namespace vclink::git
