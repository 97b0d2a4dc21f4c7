// SPDX-License-Identifier: MIT
#pragma once

#include <stddef.h> // NOLINT(modernize-deprecated-headers): C includes this header too

#ifdef __cplusplus
extern "C"
{
#endif

    /// The measured region: a program begins and ends it once, around nothing but the call that is
    /// measured. Within it callgrind counts instructions (to be started with --instr-atstart=no),
    /// the clock runs, and allocations are counted (with vclink_bench_allocations preloaded).
    void beginRegion(void);
    void endRegion(void);

    /// Prints what was measured, "name value" a line.
    /// @param entries how many results the call gave
    void printRegion(size_t entries);

#ifdef __cplusplus
}
#endif
