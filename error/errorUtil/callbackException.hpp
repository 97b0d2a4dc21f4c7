// SPDX-License-Identifier: MIT
#pragma once

#include <exception>

namespace vclink::git
{

/// The calling thread's slot for an exception that a callback raised inside libgit2, null when none
/// waits. The slot, and what is left in it, is destroyed when the thread ends.
/// @throws std::bad_alloc at a thread's first use
std::exception_ptr &pendingCallbackException();

/// Puts an exception into the calling thread's slot; what the slot held before is released.
/// @throws std::bad_alloc at a thread's first use
void storeCallbackException(std::exception_ptr &&exception);

/// The code that a callback hands back to libgit2 after it has stored an exception: GIT_EUSER.
int callbackErrorCode() noexcept;

/// Reports the exception in flight and the stack to the log. To be called inside a handler.
/// @throws what the sinks raise
void reportCallbackException();

/// What a callback's barrier does with the exception in flight: reports it, stores it in the
/// thread's slot for GitErrorPolicy::throwIfError, and returns callbackErrorCode(). To be called
/// inside a handler.
/// @throws std::bad_alloc, and what the sinks raise
[[nodiscard]] int parkCallbackException();

} // namespace vclink::git
