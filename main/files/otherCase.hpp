// SPDX-License-Identifier: MIT
#pragma once

#include <git2/strarray.h>
#include <git2/types.h>

#include "util/repository/ChangedFiles.hpp"

namespace vclink::git
{

/// Refuses a changed file if the index has another file whose name differs only in case, and
/// `core.ignorecase` is set: libgit2 would store its content under the other name.
/// @throws LibGit2Exception that names both
void refuseOtherCase(git_index *index, const ChangedFiles &changed);

/// Refuses a listed file in the same case: libgit2 would act on both.
/// @throws LibGit2Exception that names both
void refuseOtherCase(git_index *index, const git_strarray &listed);

} // namespace vclink::git
