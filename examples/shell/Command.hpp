// SPDX-License-Identifier: MIT
#pragma once

#include <memory>
#include <vector>

#include <CLI/CLI.hpp>

#include "exitStatus.hpp"

namespace vclink::shell
{

class Session;

/// A command of the shell. An object serves one command line: it receives its arguments while the
/// line is read, and runs at most once.
class Command
{
  public:
    Command() = default;
    Command(const Command &) = delete;
    Command &operator=(const Command &) = delete;
    virtual ~Command();

    /// Declares the command's arguments, which are written into this object. `line` is the
    /// command's own part of the command line.
    virtual void declare(CLI::App &line) = 0;

    /// Carries the command out. Failure is an exception; see reportFailure().
    /// @return Done, or Failed for an answer of "no"
    virtual ExitStatus run(Session &session) = 0;
};

/// A command as the command line knows it.
struct CommandEntry
{
    const char *name;
    const char *summary;
    std::unique_ptr<Command> (*make)();
};

/// All commands, in the order of the help text.
const std::vector<CommandEntry> &commandTable();

} // namespace vclink::shell
