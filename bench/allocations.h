// SPDX-License-Identifier: MIT
#pragma once

#include <stddef.h>

/// What vclink_bench_allocations, a library to be preloaded (LD_PRELOAD), counts: the program's
/// calls of malloc, calloc, realloc and the aligned forms, C++'s new included, and the bytes they
/// ask for. Memory that is mapped is not seen. For programs of one thread.
struct AllocationCounts
{
    /// Counts while it is not 0.
    int enabled;
    size_t allocations;
    size_t allocatedBytes;
    /// Bytes of blocks freed, also of blocks that were allocated before counting began.
    size_t freedBytes;
    /// The most bytes that were held at once of what was asked for while counting.
    size_t peakBytes;
};

/// Where the preloaded library has its AllocationCounts; to be found with dlsym.
#define VCLINK_BENCH_ALLOCATION_COUNTS "vclinkBenchAllocationCounts"
