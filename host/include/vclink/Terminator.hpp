// SPDX-License-Identifier: MIT
#pragma once

#include <memory>

#include "vclink_host/export.hpp"

namespace vclink
{

/// A source of cancellation. It is opaque to a back end, which only attaches a PollableTerminator
/// to it. The host requests a cancellation with vclink_host::requestCancellation.
class VCLINK_HOST_EXPORT Terminator
{
  public:
    Terminator();
    Terminator(const Terminator &) = delete;
    Terminator &operator=(const Terminator &) = delete;
    ~Terminator();

    /// Opaque: the signal that sends a request to the attached pollers.
    struct Impl;
    Impl &impl() noexcept;

  private:
    std::unique_ptr<Impl> impl_;
};

} // namespace vclink
