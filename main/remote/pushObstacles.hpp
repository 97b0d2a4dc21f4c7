// SPDX-License-Identifier: MIT
#pragma once

#include <git2/remote.h>
#include <git2/types.h>

#include "util/path/PathspecArray.hpp"

namespace vclink::git
{

/// Refuses a push that would replace a tag of the remote without a '+', as git does before it
/// pushes. Asks the remote only if a tag is pushed; the push on the same handle then uses the
/// connection. Also calls refuseRejectedPush. git_remote_connect, git_remote_ls.
/// @param refspecs what the push is given
/// @throws LibGit2Exception that names the reference, or if a call fails
void refusePushThatLoses(git_repository *repository, git_remote *remote,
                         const PathspecArray &refspecs, const git_push_options &options);

} // namespace vclink::git
