// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>

namespace vclink::test
{

/// Counts the allocations by operator new since its construction, of all threads and of the shared
/// libraries too. A program that uses it has its operator new and delete replaced by ones that
/// count and hand on to malloc and free.
class AllocationCounter
{
  public:
    AllocationCounter() noexcept;

    /// How many allocations there were.
    std::size_t count() const noexcept;
    /// How many bytes they asked for.
    std::size_t bytes() const noexcept;

  private:
    std::size_t countBefore_;
    std::size_t bytesBefore_;
};

} // namespace vclink::test
