// SPDX-License-Identifier: MIT
#pragma once

#include <git2/types.h>

namespace vclink::git
{

/// Returns a setting that is true or false; false if it does not exist. git_config_get_bool.
/// @throws LibGit2Exception if it has another value
bool isSet(git_config *config, const char *setting);

/// Refuses values of `core.autocrlf`, `core.safecrlf` and `core.eol` that libgit2 cannot read. With
/// them it would convert the line ends of every file, also of binary ones. git_config_get_mapped.
/// @throws LibGit2Exception that names the setting and its value
void refuseUnreadableSettings(git_repository *repository);

} // namespace vclink::git
