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
    boost::uuids::detail::sha1::digest_type words{};
    hash.get_digest(words);
    for (std::size_t i = 0; i < checksumSize; ++i)
        index[end + i] = static_cast<char>(words[i / 4] >> (24 - i % 4 * 8));
}

} // namespace vclink::test
