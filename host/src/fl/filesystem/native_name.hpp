// SPDX-License-Identifier: MIT
#pragma once

#include <sys/types.h>

#include "fl/ustring.hpp"

namespace fl::filesystem
{

/// open(2) on a name of the host's, with O_CLOEXEC; tried again when a signal interrupts it.
/// @return the descriptor, or -1 with errno set; a name that holds a NUL character does not exist
int openNative(const ustring &name, int flags, mode_t mode);

/// Closes a descriptor at its end, unless it was released before.
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
