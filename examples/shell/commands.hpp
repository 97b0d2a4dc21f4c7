// SPDX-License-Identifier: MIT
#pragma once

#include <memory>
#include <string>

#include "Command.hpp"

/// The makers of the commands, each defined in the source file of its command.
namespace vclink::shell
{

std::unique_ptr<Command> makeStatusCommand();
std::unique_ptr<Command> makeAddCommand();
std::unique_ptr<Command> makeRemoveCommand();
std::unique_ptr<Command> makeResolvedCommand();
std::unique_ptr<Command> makeCommitCommand();
std::unique_ptr<Command> makeRevertCommand();
std::unique_ptr<Command> makeBranchesCommand();
std::unique_ptr<Command> makeBranchCommand();
std::unique_ptr<Command> makeSwitchCommand();
std::unique_ptr<Command> makeCurrentCommand();
std::unique_ptr<Command> makeRevisionCommand();
std::unique_ptr<Command> makeStateCommand();
std::unique_ptr<Command> makeMergeCommand();
std::unique_ptr<Command> makeAttributesCommand();
std::unique_ptr<Command> makeConfigCommand();
std::unique_ptr<Command> makeCloneCommand();
std::unique_ptr<Command> makeFetchCommand();
std::unique_ptr<Command> makePushCommand();
std::unique_ptr<Command> makeHeadsCommand();
std::unique_ptr<Command> makeProbeCommand();
std::unique_ptr<Command> makeVersionCommand();

/// The versions of the program and of libgit2, a line each.
std::string versionText();

} // namespace vclink::shell
