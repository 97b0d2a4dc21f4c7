// SPDX-License-Identifier: MIT
#pragma once

namespace vclink::test
{

/// Lets the next `count` allocations by operator new succeed and the one after them fail; those
/// that follow succeed again. A program that uses this has its operator new and delete replaced.
/// For programs in which one thread allocates.
void letAllocationsSucceed(int count);

/// Ends that.
/// @return whether an allocation has failed
bool letAllAllocationsSucceed();

/// Lets all allocations succeed, and does not count them, while it lives.
class AllocationsSucceed
{
  public:
    AllocationsSucceed() noexcept;
    AllocationsSucceed(const AllocationsSucceed &) = delete;
    AllocationsSucceed &operator=(const AllocationsSucceed &) = delete;
    ~AllocationsSucceed();
};

} // namespace vclink::test
