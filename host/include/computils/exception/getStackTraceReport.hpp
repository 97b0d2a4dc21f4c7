// SPDX-License-Identifier: MIT
#pragma once

#include "fl/ustring.hpp"
#include "vclink_host/export.hpp"

namespace computils::exception
{

/// Returns a stack as text, one line for each frame: inside a handler of an exception that recorded
/// its stack, the stack of that exception, otherwise the caller's stack.
/// @throws std::bad_alloc
VCLINK_HOST_EXPORT ustring getStackTraceReport();

} // namespace computils::exception
