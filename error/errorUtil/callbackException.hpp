// SPDX-License-Identifier: MIT
#pragma once

#include <exception>

namespace vclink::git
{

/// Returns the calling thread's slot for an exception that a callback threw inside libgit2, null if
/// there is none. The slot and its content are destroyed when the thread ends.
/// @throws std::bad_alloc at a thread's first use
std::exception_ptr &pendingCallbackException();

/// Puts an exception into the calling thread's slot, and releases the previous one.
/// @throws std::bad_alloc at a thread's first use
void storeCallbackException(std::exception_ptr &&exception);

/// Returns the code that a callback returns to libgit2 after it has stored an exception: GIT_EUSER.
int callbackErrorCode() noexcept;

/// Logs the exception in flight and the stack. Call it inside a handler.
/// @throws what the sinks throw
void reportCallbackException();

/// Handles the exception in flight for a callback: logs it, stores it in the thread's slot for
/// GitErrorPolicy::throwIfError, and returns callbackErrorCode(). Call it inside a handler.
/// @throws std::bad_alloc, and what the sinks throw
[[nodiscard]] int parkCallbackException();

} // namespace vclink::git
