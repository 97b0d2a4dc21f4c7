// SPDX-License-Identifier: MIT
#include "support/AllocationCount.hpp"

#include <cstdlib>
#include <new>

namespace
{

thread_local std::size_t allocationCount = 0;

void *tryToAllocate(std::size_t size) noexcept
{
    ++allocationCount;
    return std::malloc(size == 0 ? 1 : size);
}

void *allocate(std::size_t size)
{
    if (void *memory = tryToAllocate(size))
    {
        return memory;
    }
    throw std::bad_alloc();
}

} // namespace

namespace vclink_host_tests
{

std::size_t getAllocationCount() noexcept
{
    return allocationCount;
}

} // namespace vclink_host_tests

void *operator new(std::size_t size)
{
    return allocate(size);
}

void *operator new[](std::size_t size)
{
    return allocate(size);
}

void *operator new(std::size_t size, const std::nothrow_t & /*tag*/) noexcept
{
    return tryToAllocate(size);
}

void *operator new[](std::size_t size, const std::nothrow_t & /*tag*/) noexcept
{
    return tryToAllocate(size);
}

void operator delete(void *memory) noexcept
{
    std::free(memory);
}

void operator delete[](void *memory) noexcept
{
    std::free(memory);
}

void operator delete(void *memory, std::size_t /*size*/) noexcept
{
    std::free(memory);
}

void operator delete[](void *memory, std::size_t /*size*/) noexcept
{
    std::free(memory);
}

void operator delete(void *memory, const std::nothrow_t & /*tag*/) noexcept
{
    std::free(memory);
}

void operator delete[](void *memory, const std::nothrow_t & /*tag*/) noexcept
{
    std::free(memory);
}
