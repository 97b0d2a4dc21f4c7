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

} // namespace vclink::shell
