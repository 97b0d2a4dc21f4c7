// SPDX-License-Identifier: MIT
#pragma once

#include <optional>
#include <string>

#include "vclink/git/BranchManager.hpp"

namespace vclink::shell
{

/// The id of what a revision text names, 40 hexadecimal digits; nothing where it names nothing, or
/// can't be read.
std::optional<std::string> findRevision(const git::BranchManager &manager,
                                        const std::string &revision);

/// Whether there is a local branch of this short name.
bool isBranch(const git::BranchManager &manager, const std::string &name);

/// Whether a name that leads to no commit is that of a branch, also a remote-tracking one, whose
/// commit can't be read. "HEAD" counts too, unless there is no commit yet.
/// @throws git::LibGit2Exception if the repository can't be opened
bool isUnreadable(const git::BranchManager &manager, const std::string &name);

/// Whether the commit of HEAD or its tree can't be read. libgit2 then reports the states of a
/// working copy before the first commit.
/// @throws git::LibGit2Exception if the repository can't be opened
bool isHeadUnreadable(const git::BranchManager &manager);

} // namespace vclink::shell
