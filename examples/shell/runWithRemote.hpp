// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <string>

#include "RemoteLog.hpp"
#include "exitStatus.hpp"
#include "runStoppable.hpp"

namespace vclink::shell
{

class Session;

/// Runs an operation of the back end with a remote, and takes notes of it. A line with a clock
/// shows that it is at work, and a terminal also shows what the server says. If libgit2 fails,
/// reports its failure with the server's words, and what to do if access was refused.
/// @param text what is being done
/// @return what the operation returns, or Failed
/// @throws any other exception of the operation
ExitStatus runWithRemote(Session &session, const std::string &text, RemoteNotes &notes,
                         const std::function<ExitStatus()> &operation);

/// As runWithRemote(), with Ctrl-C asking to stop; see runStoppable().
ExitStatus runStoppableWithRemote(Session &session, Stops stops, const std::string &text,
                                  RemoteNotes &notes, const std::function<void()> &operation);

/// Writes what the server has said, unless it is written already.
void tellServersWords(const RemoteNotes &notes);

} // namespace vclink::shell
