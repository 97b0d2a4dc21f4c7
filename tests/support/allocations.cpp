// SPDX-License-Identifier: MIT
// Replaces the program's operator new and delete, for AllocationCounter and FailingAllocations.
#include "support/AllocationCounter.hpp"

#include <atomic>
#include <cstdlib>
#include <new>

#include "support/FailingAllocations.hpp"

namespace
{

std::atomic<std::size_t> allocationCount{0};
std::atomic<std::size_t> allocatedBytes{0};
/// How many allocations succeed before one fails; negative: none fails.
int allocationsLeft = -1;
int pauses = 0;

void *allocate(std::size_t size, std::size_t alignment) noexcept
{
    if (allocationsLeft >= 0 && pauses == 0 && allocationsLeft-- == 0)
        return nullptr;
    allocationCount.fetch_add(1, std::memory_order_relaxed);
    allocatedBytes.fetch_add(size, std::memory_order_relaxed);
    // The size of an aligned allocation is a multiple of the alignment; no allocation is empty.
    const std::size_t rounded = (size + alignment - 1) / alignment * alignment;
    return alignment <= alignof(std::max_align_t)
               ? std::malloc(size != 0 ? size : 1)
               : std::aligned_alloc(alignment, rounded != 0 ? rounded : alignment);
}

void *allocateOrThrow(std::size_t size, std::size_t alignment)
{
    void *memory = allocate(size, alignment);
    if (memory == nullptr)
        throw std::bad_alloc();
    return memory;
}

} // namespace

void *operator new(std::size_t size)
{
    return allocateOrThrow(size, 1);
}
void *operator new[](std::size_t size)
{
    return allocateOrThrow(size, 1);
}
void *operator new(std::size_t size, const std::nothrow_t &) noexcept
{
    return allocate(size, 1);
}
void *operator new[](std::size_t size, const std::nothrow_t &) noexcept
{
    return allocate(size, 1);
}
void *operator new(std::size_t size, std::align_val_t alignment)
{
    return allocateOrThrow(size, static_cast<std::size_t>(alignment));
}
void *operator new[](std::size_t size, std::align_val_t alignment)
{
    return allocateOrThrow(size, static_cast<std::size_t>(alignment));
}
void operator delete(void *memory) noexcept
{
    std::free(memory);
}
void operator delete[](void *memory) noexcept
{
    std::free(memory);
}
void operator delete(void *memory, std::size_t) noexcept
{
    std::free(memory);
}
void operator delete[](void *memory, std::size_t) noexcept
{
    std::free(memory);
}
void operator delete(void *memory, std::align_val_t) noexcept
{
    std::free(memory);
}
void operator delete[](void *memory, std::align_val_t) noexcept
{
    std::free(memory);
}
void operator delete(void *memory, std::size_t, std::align_val_t) noexcept
{
    std::free(memory);
}
void operator delete[](void *memory, std::size_t, std::align_val_t) noexcept
{
    std::free(memory);
}

namespace vclink::test
{

AllocationCounter::AllocationCounter() noexcept
    : countBefore_(allocationCount.load()), bytesBefore_(allocatedBytes.load())
{
}

std::size_t AllocationCounter::count() const noexcept
{
    return allocationCount.load() - countBefore_;
}

std::size_t AllocationCounter::bytes() const noexcept
{
    return allocatedBytes.load() - bytesBefore_;
}

void letAllocationsSucceed(int count)
{
    allocationsLeft = count;
}

bool letAllAllocationsSucceed()
{
    const bool hasFailed = allocationsLeft < 0;
    allocationsLeft = -1;
    return hasFailed;
}

AllocationsSucceed::AllocationsSucceed() noexcept
{
    ++pauses;
}

AllocationsSucceed::~AllocationsSucceed()
{
    --pauses;
}

} // namespace vclink::test
