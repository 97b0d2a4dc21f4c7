// SPDX-License-Identifier: MIT
#define _GNU_SOURCE
#include "bench/region.h"

#include <dlfcn.h>
#include <stdio.h>
#include <stdlib.h>
#include <string.h>
#include <sys/resource.h>
#include <time.h>

#include <valgrind/callgrind.h>

#include "bench/allocations.h"

static struct AllocationCounts *counts;
static struct timespec started;
static struct timespec ended;
static long long processorTime;
static void *displacement;

/// Moves what the heap gives out within the region by so many bytes: see COUNTS in programs.py.
static void displaceHeap(void)
{
    const char *const bytes = getenv("VCLINK_BENCH_DISPLACEMENT");
    displacement = bytes == NULL ? NULL : malloc(strtoul(bytes, NULL, 10));
}

static long long nanosecondsOf(const struct timeval *time)
{
    return (long long)time->tv_sec * 1000000000 + (long long)time->tv_usec * 1000;
}

/// What this process and the children that it has waited for have used, in nanoseconds.
static long long readProcessorTime(void)
{
    struct rusage own;
    struct rusage children;
    getrusage(RUSAGE_SELF, &own);
    getrusage(RUSAGE_CHILDREN, &children);
    return nanosecondsOf(&own.ru_utime) + nanosecondsOf(&own.ru_stime) +
           nanosecondsOf(&children.ru_utime) + nanosecondsOf(&children.ru_stime);
}

void beginRegion(void)
{
    displaceHeap();
    counts = dlsym(RTLD_DEFAULT, VCLINK_BENCH_ALLOCATION_COUNTS);
    if (counts != NULL)
    {
        counts->enabled = 1;
    }
    processorTime = readProcessorTime();
    clock_gettime(CLOCK_MONOTONIC, &started);
    CALLGRIND_START_INSTRUMENTATION;
}

void endRegion(void)
{
    CALLGRIND_STOP_INSTRUMENTATION;
    clock_gettime(CLOCK_MONOTONIC, &ended);
    processorTime = readProcessorTime() - processorTime;
    if (counts != NULL)
    {
        counts->enabled = 0;
    }
}

/// The most memory that this program has had in use. getrusage would count what its parent had
/// before exec, too.
static long readPeakKib(void)
{
    long kib = -1;
    char line[256];
    FILE *const status = fopen("/proc/self/status", "r");
    while (status != NULL && fgets(line, sizeof line, status) != NULL)
    {
        if (strncmp(line, "VmHWM:", 6) == 0)
        {
            kib = strtol(line + 6, NULL, 10);
        }
    }
    if (status != NULL)
    {
        fclose(status);
    }
    return kib;
}

void printRegion(size_t entries)
{
    printf("entries %zu\n", entries);
    printf("nanoseconds %lld\n", (long long)(ended.tv_sec - started.tv_sec) * 1000000000 +
                                     (ended.tv_nsec - started.tv_nsec));
    printf("processor_nanoseconds %lld\n", processorTime);
    printf("peak_kib %ld\n", readPeakKib());
    if (counts != NULL)
    {
        printf("allocations %zu\n", counts->allocations);
        printf("allocated_bytes %zu\n", counts->allocatedBytes);
        printf("held_bytes %lld\n",
               (long long)counts->allocatedBytes - (long long)counts->freedBytes);
        printf("peak_bytes %zu\n", counts->peakBytes);
    }
}
