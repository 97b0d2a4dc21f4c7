// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "vclink/git/GitError.hpp"

namespace vclink::shell
{

/// What is to be done about a refused access, in a sentence or a few: libgit2's own text often says
/// something else, and never what to do.
/// @param failure of the operation
/// @param credentials the kinds that the server asked for last, see RemoteNotes
/// @return an empty text where the failure has another cause
std::string explainRefusedAccess(const git::GitError &failure, unsigned credentials);

} // namespace vclink::shell
