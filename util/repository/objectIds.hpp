// SPDX-License-Identifier: MIT
#pragma once

#include <algorithm>
#include <cstddef>
#include <iterator>

#include <git2/oid.h>

namespace vclink::git
{

/// The number of digits of an id. libgit2's own name for it depends on the release.
constexpr std::size_t idTextSize = 2 * sizeof(git_oid::id);

/// As git_oid_equal, without a function call for each file.
inline bool isSameId(const git_oid &left, const git_oid &right) noexcept
{
    return std::equal(std::begin(left.id), std::end(left.id), std::begin(right.id));
}

} // namespace vclink::git
