// SPDX-License-Identifier: MIT
#include "allocations.h"

#include <errno.h>
#include <stdalign.h>
#include <stdint.h>
#include <string.h>

#define EXPORTED __attribute__((visibility("default")))

// The allocator that this library replaces.
extern void *__libc_malloc(size_t size);
extern void *__libc_calloc(size_t count, size_t size);
extern void *__libc_realloc(void *block, size_t size);
extern void *__libc_memalign(size_t alignment, size_t size);
extern void __libc_free(void *block);

extern struct AllocationCounts vclinkBenchAllocationCounts;
EXPORTED struct AllocationCounts vclinkBenchAllocationCounts;

/// Stands right before each block, so that the bytes asked for are known when it is freed; the
/// allocator itself knows only what it rounded them up to.
struct Header
{
    alignas(max_align_t) size_t size;
    void *base;
};

static struct Header *headerOf(void *block)
{
    return (struct Header *)block - 1;
}

static void countAllocation(size_t size)
{
    if (vclinkBenchAllocationCounts.enabled)
    {
        struct AllocationCounts *const counts = &vclinkBenchAllocationCounts;
        ++counts->allocations;
        counts->allocatedBytes += size;
        // Less than nothing is held after blocks from before were freed.
        if (counts->allocatedBytes > counts->freedBytes &&
            counts->allocatedBytes - counts->freedBytes > counts->peakBytes)
        {
            counts->peakBytes = counts->allocatedBytes - counts->freedBytes;
        }
    }
}

static void countFree(size_t size)
{
    if (vclinkBenchAllocationCounts.enabled)
    {
        vclinkBenchAllocationCounts.freedBytes += size;
    }
}

/// `offset` is where the block begins behind `base`.
static void *finish(void *base, size_t offset, size_t size)
{
    if (base == NULL)
    {
        errno = ENOMEM;
        return NULL;
    }
    void *const block = (char *)base + offset;
    headerOf(block)->size = size;
    headerOf(block)->base = base;
    countAllocation(size);
    return block;
}

static size_t withHeader(size_t size, size_t header)
{
    return size > SIZE_MAX - header ? SIZE_MAX : size + header;
}

EXPORTED void *malloc(size_t size)
{
    const size_t offset = sizeof(struct Header);
    return finish(__libc_malloc(withHeader(size, offset)), offset, size);
}

EXPORTED void free(void *block)
{
    if (block != NULL)
    {
        countFree(headerOf(block)->size);
        __libc_free(headerOf(block)->base);
    }
}

EXPORTED void *calloc(size_t count, size_t size)
{
    size_t bytes = 0;
    if (__builtin_mul_overflow(count, size, &bytes))
    {
        errno = ENOMEM;
        return NULL;
    }
    const size_t offset = sizeof(struct Header);
    return finish(__libc_calloc(1, withHeader(bytes, offset)), offset, bytes);
}

static void *aligned(size_t alignment, size_t size)
{
    const size_t offset = alignment > sizeof(struct Header) ? alignment : sizeof(struct Header);
    return finish(__libc_memalign(offset, withHeader(size, offset)), offset, size);
}

EXPORTED void *realloc(void *block, size_t size)
{
    if (block == NULL)
    {
        return malloc(size);
    }
    const struct Header before = *headerOf(block);
    const size_t offset = (size_t)((char *)block - (char *)before.base);
    if (offset != sizeof(struct Header))
    {
        void *const moved = malloc(size);
        if (moved != NULL)
        {
            memcpy(moved, block, before.size < size ? before.size : size);
            free(block);
        }
        return moved;
    }
    void *const grown = finish(__libc_realloc(before.base, withHeader(size, offset)), offset, size);
    if (grown != NULL)
    {
        countFree(before.size);
    }
    return grown;
}

EXPORTED void *memalign(size_t alignment, size_t size)
{
    return aligned(alignment, size);
}

EXPORTED void *aligned_alloc(size_t alignment, size_t size)
{
    return aligned(alignment, size);
}

EXPORTED int posix_memalign(void **block, size_t alignment, size_t size)
{
    void *const allocated = aligned(alignment, size);
    if (allocated == NULL)
    {
        return ENOMEM;
    }
    *block = allocated;
    return 0;
}

EXPORTED size_t malloc_usable_size(void *block)
{
    return block == NULL ? 0 : headerOf(block)->size;
}
