// SPDX-License-Identifier: MIT
#pragma once

#include <git2/types.h>

#include "error/errorUtil/OwnedHandle.hpp"

namespace vclink::git
{

/// Returns the author and time of a commit: `user.name` and `user.email`, or
/// makeFallbackSignature() unless both are configured. git_signature_default.
/// @throws LibGit2Exception if the configuration cannot be read or has an empty name, and what
/// makeFallbackSignature throws
[[nodiscard]] OwnedHandle<git_signature> makeSignature(git_repository *repository);

/// Returns an identity from the environment and the machine's name: "USER", or "LOGNAME" if that is
/// unset, with this name, "@" and the machine's name as the address. Reads the environment without
/// a lock. git_signature_now.
/// @throws the exception of shared_vclink::git::NoUserName if both variables are unset
/// @throws boost::system::system_error if the machine's name cannot be found out
/// @throws LibGit2Exception if libgit2 refuses the values, e.g. an empty name
[[nodiscard]] OwnedHandle<git_signature> makeFallbackSignature();

} // namespace vclink::git
