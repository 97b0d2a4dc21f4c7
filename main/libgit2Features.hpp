// SPDX-License-Identifier: MIT
#pragma once

namespace vclink::git
{

/// Returns the features of the linked libgit2: only the bits of git_feature_t for threads, HTTPS,
/// SSH and file times in nanoseconds. git_libgit2_features.
int libgit2Features();

} // namespace vclink::git
