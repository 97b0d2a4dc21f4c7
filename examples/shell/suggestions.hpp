// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

#include "vclink/git/BranchManager.hpp"

namespace vclink::shell
{

/// " Did you mean '...'?" for the known word that is most like a word that is not known; empty if
/// none is.
std::string suggest(const std::string &word, const std::vector<std::string> &known);

/// As suggest(), for the name of a command: also what git calls it.
std::string suggestCommand(const std::string &word);

/// What there is in place of a branch that there is not: one of almost that name, or one of a
/// remote; empty if nothing is.
std::string suggestBranch(const git::BranchManager &manager, const std::string &name);

/// What to do in place of a command with an option that git has; empty if nothing is known.
/// @param option empty for a name too many
std::string suggestInstead(const std::string &command, const std::string &option);

} // namespace vclink::shell
