// SPDX-License-Identifier: MIT
#pragma once

#include "fl/ustring.hpp"
#include "vclink_host/export.hpp"

namespace computils::exception
{

/// The stack as text, one line a frame: inside a handler of an exception that recorded its stack,
/// the stack of that exception; elsewhere the caller's own.
/// @throws std::bad_alloc
VCLINK_HOST_EXPORT ustring getStackTraceReport();

} // namespace computils::exception
