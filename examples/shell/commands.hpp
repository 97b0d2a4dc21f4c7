// SPDX-License-Identifier: MIT
#pragma once

#include <memory>

#include "Command.hpp"

/// The makers of the commands, each defined in the source file of its command.
namespace vclink::shell
{

std::unique_ptr<Command> makeStatusCommand();
std::unique_ptr<Command> makeProbeCommand();
std::unique_ptr<Command> makeVersionCommand();

} // namespace vclink::shell
