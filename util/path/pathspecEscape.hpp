// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <string_view>

namespace vclink::git
{

/// A pathspec that libgit2 reads as this name where it would otherwise read something else: a
/// leading '#' begins a comment there, a leading '!' negates, white space at the end is cut, and a
/// newline, vertical tab or form feed ends the pattern. Wildcard characters stay wildcards, save a
/// '[' in such a name, which then means itself.
std::string escapePathspec(std::string_view name);

/// A pathspec that matches nothing but this name, wildcard characters included.
std::string escapeExactPathspec(std::string_view name);

} // namespace vclink::git
