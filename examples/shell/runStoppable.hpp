// SPDX-License-Identifier: MIT
#pragma once

#include <functional>

#include "exitStatus.hpp"

namespace vclink::shell
{

class Session;

/// Runs an operation of the back end that can be cancelled, with Ctrl-C asking for that; see
/// InterruptWatch. When it fails after the person has asked, its failure is told here.
/// @return Done, or Cancelled for such a failure
/// @throws what the operation raises when the person has not asked to stop
ExitStatus runStoppable(Session &session, const std::function<void()> &operation);

} // namespace vclink::shell
