// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

#include "vclink/git/BranchManager.hpp"

namespace vclink::shell
{

/// " Did you mean '...'?" with the known word that is most similar to an unknown one; empty if none
/// is similar.
std::string suggest(const std::string &word, const std::vector<std::string> &known);

/// As suggest(), for the name of a command; also knows git's names.
std::string suggestCommand(const std::string &word);

/// What to use instead of a branch that does not exist: one with a similar name, or one of a
/// remote; empty if there is neither.
std::string suggestBranch(const git::BranchManager &manager, const std::string &name);

/// What to do in place of a command with an option that git has; empty if nothing is known.
/// @param option empty for a name too many
std::string suggestInstead(const std::string &command, const std::string &option);

} // namespace vclink::shell
