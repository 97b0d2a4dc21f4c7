// SPDX-License-Identifier: MIT
#pragma once

#include <algorithm>
#include <iterator>

#include <git2/oid.h>

namespace vclink::git
{

/// As git_oid_equal, without a call for each of many files.
inline bool isSameId(const git_oid &left, const git_oid &right) noexcept
{
    return std::equal(std::begin(left.id), std::end(left.id), std::begin(right.id));
}

} // namespace vclink::git
