// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "vclink/CMAdapter.hpp"
#include "vclink/git/BranchManager.hpp"

namespace vclink::shell
{

/// After a switch that was refused: which files are in its way, or what is unfinished, and what to
/// do.
void tellSwitchObstacles(CMAdapter &adapter, const git::BranchManager &manager,
                         const std::string &branch);

} // namespace vclink::shell
