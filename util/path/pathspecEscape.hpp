// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <string_view>

namespace vclink::git
{

/// Returns a pathspec that libgit2 reads as this name. Without it, a leading '#' begins a comment,
/// a leading '!' negates, white space at the end is removed, and a newline, vertical tab or form
/// feed ends the pattern. Wildcard characters remain wildcards, except that a '[' in such a name
/// means itself.
std::string escapePathspec(std::string_view name);

/// Returns a pathspec that matches only this name, even if it has wildcard characters.
std::string escapeExactPathspec(std::string_view name);

} // namespace vclink::git
