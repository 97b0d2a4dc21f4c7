// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "RemoteLog.hpp"
#include "vclink/git/GitError.hpp"

namespace vclink::shell
{

/// What to do if access was refused, in a sentence or a few. libgit2's own text often names another
/// cause, and never says what to do.
/// @param failure of the operation
/// @param notes of the operation
/// @return an empty text if the failure has another cause
std::string explainRefusedAccess(const git::GitError &failure, const RemoteNotes &notes);

} // namespace vclink::shell
