// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>
#include <string>

#include <boost/uuid/detail/sha1.hpp>

namespace vclink::test
{

/// Corrects the checksum of the bytes of an index: one with another checksum is refused unread.
inline void correctChecksum(std::string &index)
{
    constexpr std::size_t checksumSize = 20;
    if (index.size() < checksumSize)
        return;
    const std::size_t end = index.size() - checksumSize;
    boost::uuids::detail::sha1 hash;
    hash.process_bytes(index.data(), end);
    boost::uuids::detail::sha1::digest_type digest{};
    hash.get_digest(digest);
    // Bytes, or words in releases without bytes.
    constexpr std::size_t unit = sizeof digest[0];
    for (std::size_t i = 0; i < checksumSize; ++i)
        index[end + i] = static_cast<char>(digest[i / unit] >> (unit - 1 - i % unit) * 8);
}

} // namespace vclink::test
