// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <utility>

namespace vclink::git
{

/// Runs a function at the end of a scope, on every way out. Does nothing for an empty function.
/// Ignores exceptions of the function.
class ScopedCleanup
{
  public:
    ScopedCleanup() = default;
    [[nodiscard]] explicit ScopedCleanup(std::function<void()> cleanup)
        : cleanup_(std::move(cleanup))
    {
    }
    ScopedCleanup(const ScopedCleanup &) = delete;
    ScopedCleanup &operator=(const ScopedCleanup &) = delete;
    ~ScopedCleanup();

  private:
    std::function<void()> cleanup_;
};

} // namespace vclink::git
