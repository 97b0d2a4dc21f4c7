// SPDX-License-Identifier: MIT

#include "support/FailingAllocations.hpp"

#include "support/interposition.hpp"

/// Replaces boost::filesystem::path::compare, which must not throw and yet allocates up to release
/// 1.76: there a failing allocation ends the process, whoever compares.
extern "C" __attribute__((visibility("default"))) int comparePaths(const void *left,
                                                                   const void *right) noexcept
    __asm__("_ZNK5boost10filesystem4path7compareERKS1_");

extern "C" int comparePaths(const void *left, const void *right) noexcept
{
    const vclink::test::AllocationsSucceed pause;
    static auto *const compare = vclink::test::findNext<int(const void *, const void *)>(
        "_ZNK5boost10filesystem4path7compareERKS1_");
    return compare(left, right);
}
