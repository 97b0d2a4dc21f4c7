// SPDX-License-Identifier: MIT
#pragma once

#include <algorithm>
#include <array>
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

/// Returns true for the id of an empty file.
inline bool isEmptyBlob(const git_oid &id) noexcept
{
    constexpr std::array<unsigned char, sizeof(git_oid::id)> emptyBlob{
        0xe6, 0x9d, 0xe2, 0x9b, 0xb2, 0xd1, 0xd6, 0x43, 0x4b, 0x8b,
        0x29, 0xae, 0x77, 0x5a, 0xd8, 0xc2, 0xe4, 0x8c, 0x53, 0x91};
    return std::equal(emptyBlob.begin(), emptyBlob.end(), std::begin(id.id));
}

} // namespace vclink::git
