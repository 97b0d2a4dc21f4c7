// SPDX-License-Identifier: MIT
#pragma once

#include <git2/types.h>

namespace vclink::git
{

/// Returns a setting that is true or false; false if it does not exist. git_config_get_bool.
/// @throws LibGit2Exception if it has another value
bool isSet(git_config *config, const char *setting);

/// Refuses values of `core.autocrlf`, `core.safecrlf`, `core.eol` and `core.logAllRefUpdates` that
/// libgit2 cannot read. With the first three it would convert the line ends of every file, also of
/// binary ones; with the last one it fails to move HEAD, after the files have been written.
/// git_config_get_mapped.
/// @throws LibGit2Exception that names the setting and its value
void refuseUnreadableSettings(git_repository *repository);

} // namespace vclink::git
