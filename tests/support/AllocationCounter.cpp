// SPDX-License-Identifier: MIT
#include "support/AllocationCounter.hpp"

#include <atomic>
#include <cstdlib>
#include <new>

namespace
{

std::atomic<std::size_t> allocationCount{0};
std::atomic<std::size_t> allocatedBytes{0};

void *countedAllocation(std::size_t size, std::size_t alignment) noexcept
{
    allocationCount.fetch_add(1, std::memory_order_relaxed);
    allocatedBytes.fetch_add(size, std::memory_order_relaxed);
    // The size of an aligned allocation is a multiple of the alignment; no allocation is empty.
    const std::size_t rounded = (size + alignment - 1) / alignment * alignment;
    return alignment <= alignof(std::max_align_t)
               ? std::malloc(size != 0 ? size : 1)
               : std::aligned_alloc(alignment, rounded != 0 ? rounded : alignment);
}

void *countedAllocationOrThrow(std::size_t size, std::size_t alignment)
{
    void *memory = countedAllocation(size, alignment);
    if (memory == nullptr)
        throw std::bad_alloc();
    return memory;
}

} // namespace

void *operator new(std::size_t size)
{
    return countedAllocationOrThrow(size, 1);
}
void *operator new[](std::size_t size)
{
    return countedAllocationOrThrow(size, 1);
}
void *operator new(std::size_t size, const std::nothrow_t &) noexcept
{
    return countedAllocation(size, 1);
}
void *operator new[](std::size_t size, const std::nothrow_t &) noexcept
{
    return countedAllocation(size, 1);
}
void *operator new(std::size_t size, std::align_val_t alignment)
{
    return countedAllocationOrThrow(size, static_cast<std::size_t>(alignment));
}
void *operator new[](std::size_t size, std::align_val_t alignment)
{
    return countedAllocationOrThrow(size, static_cast<std::size_t>(alignment));
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

} // namespace vclink::test
