// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>
#include <optional>
#include <string>

#include "vclink/git/BranchManager.hpp"

namespace vclink::shell
{

/// The id of what a revision text names, 40 hexadecimal digits; nothing where it names nothing, or
/// can't be read.
std::optional<std::string> findRevision(const git::BranchManager &manager,
                                        const std::string &revision);

/// Whether a commit is in the history of HEAD, or HEAD itself. Looks at no more than this number of
/// commits, those nearest to HEAD first, and answers "no" if they do not tell.
/// @param id as findRevision() gives it
bool isInHistory(const git::BranchManager &manager, const std::string &id, std::size_t limit);

} // namespace vclink::shell
