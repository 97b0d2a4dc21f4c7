// SPDX-License-Identifier: MIT
#pragma once

#include <cstring>
#include <vector>

#include <gtest/gtest.h>

namespace vclink::test
{

/// All bytes of a record of libgit2, padding included.
template <class Record> std::vector<unsigned char> bytesOf(const Record &record)
{
    std::vector<unsigned char> bytes(sizeof(record));
    std::memcpy(bytes.data(), &record, sizeof(record));
    return bytes;
}

/// The record as libgit2 makes it.
template <class Record> Record initialised(int (*function)(Record *, unsigned))
{
    Record record;
    std::memset(&record, 0, sizeof(record));
    EXPECT_EQ(function(&record, 1), 0);
    return record;
}

} // namespace vclink::test
