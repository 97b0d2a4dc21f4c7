// SPDX-License-Identifier: MIT
#include <cstdint>
#include <new>
#include <string>
#include <thread>

#include <gtest/gtest.h>

#include "fl/i18n/convert.hpp"
#include "support/AllocationCounter.hpp"

namespace
{

using vclink::test::AllocationCounter;

TEST(AllocationCounter, CountsEachAllocationThatComesAfterItWithItsBytes)
{
    constexpr std::align_val_t alignment{64};
    const AllocationCounter counter;
    EXPECT_EQ(counter.count(), 0u);
    EXPECT_EQ(counter.bytes(), 0u);
    auto *const one = ::operator new(100);
    auto *const two = ::operator new[](28);
    EXPECT_EQ(counter.count(), 2u);
    EXPECT_EQ(counter.bytes(), 128u);
    const AllocationCounter inner;
    auto *const aligned = ::operator new(10, alignment);
    EXPECT_EQ(reinterpret_cast<std::uintptr_t>(aligned) % 64, 0u);
    EXPECT_EQ(counter.count(), 3u);
    EXPECT_EQ(inner.count(), 1u);
    EXPECT_EQ(inner.bytes(), 10u);
    ::operator delete(one);
    ::operator delete[](two);
    ::operator delete(aligned, alignment);
}

TEST(AllocationCounter, CountsInsideSharedLibrariesAndOtherThreads)
{
    const std::string bytes(1000, 'x');
    const AllocationCounter counter;
    const auto text = fl::i18n::utf8_to_ustring(bytes);
    EXPECT_GE(counter.count(), 1u);
    EXPECT_GE(counter.bytes(), text.size() * sizeof(char16_t));
    std::thread([] { ::operator delete(::operator new(5000)); }).join();
    EXPECT_GE(counter.bytes(), 5000u);
}

} // namespace
