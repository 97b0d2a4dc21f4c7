// SPDX-License-Identifier: MIT
#pragma once

#include <functional>

#include "exitStatus.hpp"

namespace vclink::shell
{

class Session;

/// Runs an operation of the back end, with Ctrl-C, SIGTERM and SIGHUP asking it to stop; see
/// InterruptWatch. Operations without a poll point run to their end all the same, so that none
/// leaves a lock or half of its work. If the operation fails after it was asked to stop, its
/// failure is reported here. SIGTERM and SIGHUP also set the session's status at the end.
/// @return Done, or endedBy() the signal for such a failure
/// @throws what the operation throws if nobody has asked to stop
ExitStatus runStoppable(Session &session, const std::function<void()> &operation);

} // namespace vclink::shell
