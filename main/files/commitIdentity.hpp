// SPDX-License-Identifier: MIT
#pragma once

#include <git2/types.h>

#include "error/errorUtil/OwnedHandle.hpp"

namespace vclink::git
{

/// Who makes a commit, and when: what `user.name` and `user.email` say, or, unless both are
/// configured, makeFallbackSignature(). git_signature_default.
/// @throws LibGit2Exception when the configuration can't be read or names nobody, and what
/// makeFallbackSignature raises
[[nodiscard]] OwnedHandle<git_signature> makeSignature(git_repository *repository);

/// An identity made from the environment and the machine's name: "USER", or "LOGNAME" where that
/// one is unset, and that name, "@" and the host's name as the address. git_signature_now. Reads
/// the environment without a lock.
/// @throws the exception of shared_vclink::git::NoUserName when both variables are unset
/// @throws boost::system::system_error when the host's name can't be found out
/// @throws LibGit2Exception when libgit2 refuses the values, e.g. an empty name
[[nodiscard]] OwnedHandle<git_signature> makeFallbackSignature();

} // namespace vclink::git
