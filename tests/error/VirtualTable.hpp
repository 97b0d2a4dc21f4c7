// SPDX-License-Identifier: MIT
#pragma once

#include <array>
#include <cstddef>
#include <cstring>
#include <vector>

namespace vclink::test
{

/// The slot of a virtual operation in its class's primary table, counted from 0. The two entries of
/// the destructor count. Itanium C++ ABI: the pointer to a virtual member function is 1 plus the
/// offset of its slot.
template <class MemberFunctionPointer> std::size_t slotOf(MemberFunctionPointer operation)
{
    std::array<std::size_t, 2> words{};
    static_assert(sizeof(operation) == sizeof(words));
    std::memcpy(words.data(), &operation, sizeof(words));
    return (words[0] - 1) / sizeof(void *);
}

/// The first entries of an object's primary table.
template <class Object>
std::vector<const void *> virtualTableOf(const Object &object, std::size_t slots)
{
    const void *const *table = nullptr;
    std::memcpy(&table, static_cast<const void *>(&object), sizeof(table));
    return std::vector<const void *>(table, table + slots);
}

/// How far into an object a part of it lies.
template <class Object, class Part> std::ptrdiff_t offsetIn(const Object &object, const Part &part)
{
    return reinterpret_cast<const char *>(&part) - reinterpret_cast<const char *>(&object);
}

} // namespace vclink::test
