// SPDX-License-Identifier: MIT
#include "support/FailingAllocations.hpp"

#include <cstddef>
#include <cstdlib>
#include <new>

namespace
{

/// How many allocations succeed before one fails; negative: none fails.
int allocationsLeft = -1;
int pauses = 0;

void *allocate(std::size_t size) noexcept
{
    if (pauses == 0 && allocationsLeft >= 0 && allocationsLeft-- == 0)
        return nullptr;
    return std::malloc(size != 0 ? size : 1);
}

} // namespace

namespace vclink::test
{

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

void *operator new(std::size_t size)
{
    void *const memory = allocate(size);
    if (memory == nullptr)
        throw std::bad_alloc();
    return memory;
}
void *operator new[](std::size_t size)
{
    return operator new(size);
}
void *operator new(std::size_t size, const std::nothrow_t &) noexcept
{
    return allocate(size);
}
void *operator new[](std::size_t size, const std::nothrow_t &) noexcept
{
    return allocate(size);
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
