// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "vclink/CMAdapter.hpp"
#include "vclink/git/BranchManager.hpp"

namespace vclink::shell
{

/// After a switch that was refused.
/// @throws ShellFailure that names the files that are in its way, or what is unfinished, and says
///         what to do; if nothing is found, it returns
void refuseForObstacles(CMAdapter &adapter, const git::BranchManager &manager,
                        const std::string &branch);

} // namespace vclink::shell
