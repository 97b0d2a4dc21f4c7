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
/// shows that it is at work, and a person at a terminal is told what the server says. When libgit2
/// fails, its failure is told here, with what the server said, and what to do where access was
/// refused.
/// @param text what is being done
/// @return what the operation returns, or Failed
/// @throws any other exception of the operation
ExitStatus runWithRemote(Session &session, const std::string &text, RemoteNotes &notes,
                         const std::function<ExitStatus()> &operation);

/// As runWithRemote(), with Ctrl-C asking to stop; see runStoppable().
ExitStatus runStoppableWithRemote(Session &session, Stops stops, const std::string &text,
                                  RemoteNotes &notes, const std::function<void()> &operation);

/// Tells what the server has said, unless it was told already.
void tellServersWords(const RemoteNotes &notes);

} // namespace vclink::shell
