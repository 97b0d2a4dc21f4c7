// SPDX-License-Identifier: MIT
#pragma once

#include "vclink/Terminator.hpp"
#include "vclink_host/export.hpp"

namespace vclink_host
{

/// Sends a cancellation request to every poller attached to `source`. Can be called from any
/// thread, but not from a signal handler.
VCLINK_HOST_EXPORT void requestCancellation(vclink::Terminator &source);

} // namespace vclink_host
