// SPDX-License-Identifier: MIT
#pragma once

#include "vclink/CMAdapter.hpp"

namespace vclink::shell
{

/// @throws ShellFailure in the midst of what has more to do than one commit, e.g. a rebase: a
/// commit of the back end ends it, and the rest is dropped without a word
void refuseHalfWay(CMAdapter &adapter);

} // namespace vclink::shell
