// SPDX-License-Identifier: MIT
#pragma once

#include <cstring>
#include <vector>

namespace vclink::test
{

/// All bytes of a record of libgit2, padding included.
template <class Record> std::vector<unsigned char> bytesOf(const Record &record)
{
    std::vector<unsigned char> bytes(sizeof(record));
    std::memcpy(bytes.data(), &record, sizeof(record));
    return bytes;
}

} // namespace vclink::test
