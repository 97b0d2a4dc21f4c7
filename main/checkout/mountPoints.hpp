// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <string_view>
#include <vector>

#include <git2/types.h>

#include "main/checkout/Obstacle.hpp"

namespace vclink::git
{

/// Returns the names of the mount points below a folder, relative to it.
/// @param mounts in the form of /proc/self/mountinfo
/// @param root absolute and without links, with a slash at its end
std::vector<std::string> findMountPointsBelow(std::string_view mounts, const std::string &root);

/// Reads the mounts of the process. Without /proc there are none.
std::vector<std::string> mountPointsBelow(const std::string &root);

/// A mounted file or folder can neither be removed nor replaced: libgit2 fails at it after it has
/// deleted other files, or writes to the file that is mounted, which has another name elsewhere.
Obstacle mountedAt(const std::string &name);

/// Finds a mount point that the checkout would remove or replace, or a mounted file that it would
/// change. Files in a mounted folder can change.
/// @param before null for an unborn branch
Finding findMountPoint(const std::vector<std::string> &mounts, const git_tree *before,
                       const git_tree *after);

} // namespace vclink::git
