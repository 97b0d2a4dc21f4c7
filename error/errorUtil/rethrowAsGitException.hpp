// SPDX-License-Identifier: MIT
#pragma once

#include "resource_core/BaseMsgID.hpp"

namespace vclink::git
{

/// Replaces the exception in flight by a GitException with this message, whose added text is the
/// text of the one in flight: its localized text if it is an IUserException, otherwise its what().
/// Any other exception propagates unchanged. Call it inside a handler.
/// @throws GitException, or the exception in flight
[[noreturn]] void rethrowAsGitException(const resource_core::BaseMsgID &id);

} // namespace vclink::git
