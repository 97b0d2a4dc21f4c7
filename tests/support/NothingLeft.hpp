// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>

#include "support/Descriptors.hpp"

namespace vclink::test
{

/// Whether the process has a child, running or not waited for.
bool hasChildren();

/// Fails the running test at its end when something stays behind: an open descriptor, a child
/// process, a file in the temporary folder, an exception in the thread's slot.
class NothingLeft
{
  public:
    explicit NothingLeft(std::filesystem::path temporary);
    NothingLeft(const NothingLeft &) = delete;
    NothingLeft &operator=(const NothingLeft &) = delete;
    ~NothingLeft();

  private:
    std::filesystem::path temporary_;
    NoDescriptorLeak descriptors_;
};

} // namespace vclink::test
