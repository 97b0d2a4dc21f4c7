// SPDX-License-Identifier: MIT
#pragma once

#include <sys/types.h>

#include "fl/ustring.hpp"

namespace fl::filesystem
{

/// Calls open(2) for a name of the host, with O_CLOEXEC. Tries again if a signal interrupts it.
/// @return the descriptor, or -1 with errno set; a name with a NUL character does not exist
int openNative(const ustring &name, int flags, mode_t mode);

/// Closes a descriptor at its end, unless it was released.
class DescriptorOwner
{
  public:
    explicit DescriptorOwner(int descriptor) noexcept : descriptor_(descriptor)
    {
    }
    DescriptorOwner(const DescriptorOwner &) = delete;
    DescriptorOwner &operator=(const DescriptorOwner &) = delete;
    ~DescriptorOwner();

    void release() noexcept
    {
        descriptor_ = -1;
    }

  private:
    int descriptor_;
};

} // namespace fl::filesystem
