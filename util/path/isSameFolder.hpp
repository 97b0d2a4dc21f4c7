// SPDX-License-Identifier: MIT
#pragma once

#include <string>

namespace vclink::git
{

/// Returns true if both paths lead to the same folder, also through symbolic links; false if one
/// cannot be examined.
bool isSameFolder(const std::string &one, const std::string &other) noexcept;

} // namespace vclink::git
