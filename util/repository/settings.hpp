// SPDX-License-Identifier: MIT
#pragma once

#include <git2/types.h>

namespace vclink::git
{

/// Returns a setting that is true or false; false if it does not exist. git_config_get_bool.
/// @throws LibGit2Exception if it has another value
bool isSet(git_config *config, const char *setting);

} // namespace vclink::git
