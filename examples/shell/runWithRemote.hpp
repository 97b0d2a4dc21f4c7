// SPDX-License-Identifier: MIT
#pragma once

#include <functional>

#include "RemoteLog.hpp"
#include "exitStatus.hpp"

namespace vclink::shell
{

class Session;

/// Runs an operation of the back end with a remote, and takes notes of it. When libgit2 fails, its
/// failure is told here, and what to do where access was refused.
/// @return what the operation returns, or Failed
/// @throws any other exception of the operation
ExitStatus runWithRemote(Session &session, RemoteNotes &notes,
                         const std::function<ExitStatus()> &operation);

/// As runWithRemote(), with Ctrl-C asking to stop; see runStoppable().
ExitStatus runStoppableWithRemote(Session &session, RemoteNotes &notes,
                                  const std::function<void()> &operation);

} // namespace vclink::shell
