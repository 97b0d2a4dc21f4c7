// SPDX-License-Identifier: MIT
#pragma once

#include <array>
#include <cstddef>

#include "fl/ustring.hpp"
#include "vclink_host/export.hpp"

namespace foundation::core::diag
{

/// The return addresses of a call stack, inline. A plain value; a copy has the frames too.
class VCLINK_HOST_EXPORT stacktrace_base
{
  public:
    /// The largest number of frames; deeper ones are left out.
    static constexpr std::size_t capacity = 128;

    stacktrace_base() noexcept = default;

    /// Replaces the frames by the calling thread's stack, innermost first, without the frame of
    /// this function and `skip` more. Allocates nothing.
    void capture(unsigned long skip) noexcept;

    std::size_t size() const noexcept;
    /// Returns the address of a frame. `index` must be below size().
    const void *frame(std::size_t index) const noexcept;

    /// Returns one line for each frame: its number, its function if the symbol is visible, its
    /// module.
    /// @throws std::bad_alloc
    ustring to_text() const;

  private:
    std::array<const void *, capacity> frames_{};
    std::size_t size_ = 0;
};

} // namespace foundation::core::diag
