// SPDX-License-Identifier: MIT
#pragma once

namespace vclink::git
{

/// What the linked libgit2 was built with: the bits of git_feature_t for threads, HTTPS, SSH and
/// file times in nanoseconds, and no others. git_libgit2_features.
int libgit2Features();

} // namespace vclink::git
