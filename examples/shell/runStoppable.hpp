// SPDX-License-Identifier: MIT
#pragma once

#include <functional>

#include "exitStatus.hpp"

namespace vclink::shell
{

class Session;

/// When an operation can still be stopped.
enum class Stops
{
    /// never: it goes on to its end, so that it leaves no lock and no half of its work
    Never,
    /// until it writes the first file
    BeforeWriting,
    /// when the server sends something
    WhenServerTalks
};

/// Runs an operation of the back end, with Ctrl-C, SIGTERM and SIGHUP asking it to stop; see
/// InterruptWatch. Says at once what happens to the request. If the operation fails after it was
/// asked to stop, its failure is reported here. SIGTERM and SIGHUP also set the session's status at
/// the end.
/// @return Done, or endedBy() the signal for such a failure
/// @throws what the operation throws if nobody has asked to stop
ExitStatus runStoppable(Session &session, Stops stops, const std::function<void()> &operation);

} // namespace vclink::shell
