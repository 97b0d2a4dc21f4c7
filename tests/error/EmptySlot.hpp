// SPDX-License-Identifier: MIT
#pragma once

#include "error/errorUtil/callbackException.hpp"

namespace vclink::test
{

/// No exception waits when a test begins, and none is left for the next.
struct EmptySlot
{
    EmptySlot()
    {
        git::pendingCallbackException() = nullptr;
    }
    EmptySlot(const EmptySlot &) = delete;
    EmptySlot &operator=(const EmptySlot &) = delete;
    ~EmptySlot()
    {
        git::pendingCallbackException() = nullptr;
    }
};

} // namespace vclink::test
