// SPDX-License-Identifier: MIT
#pragma once

#include <map>
#include <string>

namespace vclink::test
{

/// The descriptors that the process holds open, with what each refers to.
std::map<int, std::string> openDescriptors();

/// Fails the running test at its end when a descriptor is open that was not at its start, or the
/// other way round.
class NoDescriptorLeak
{
  public:
    NoDescriptorLeak();
    NoDescriptorLeak(const NoDescriptorLeak &) = delete;
    NoDescriptorLeak &operator=(const NoDescriptorLeak &) = delete;
    ~NoDescriptorLeak();

  private:
    std::map<int, std::string> before_;
};

} // namespace vclink::test
