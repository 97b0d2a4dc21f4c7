// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>

/// Faults that the sanitizers have to report, in inline functions as headers of the layers have
/// them. Objects that are compiled like the layers' and the tests both contain these functions.
namespace vclink::planted
{

/// Overflows for the greatest number.
[[gnu::noinline]] inline int successor(int number)
{
    return number + 1;
}

/// Reads beyond the end if there are not more bytes than `index`.
[[gnu::noinline]] inline char byteAt(const char *bytes, std::size_t index)
{
    return bytes[index];
}

/// Races with itself on another thread.
[[gnu::noinline]] inline void countUp(int &counter)
{
    ++counter;
}

/// Returns true if the copy that the linker has kept is an optimised one.
[[gnu::noinline]] inline bool isOptimised() noexcept
{
#ifdef __OPTIMIZE__
    return true;
#else
    return false;
#endif
}

/// Uses all of these, so that the layers' objects contain a copy of each.
int useAll(int number);

} // namespace vclink::planted
