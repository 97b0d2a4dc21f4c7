// SPDX-License-Identifier: MIT
#pragma once

#include <memory>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "Command.hpp"

namespace vclink::shell
{

class Output;

/// Whether progress is drawn.
enum class Progress
{
    /// if standard error is a terminal that can show it
    WhereSeen,
    Always,
    Never
};

/// What the person set before the command.
struct Settings
{
    /// folders to start in, one after the other
    std::vector<std::string> folders;
    std::optional<unsigned> severities;
    Progress progress = Progress::WhereSeen;
    /// whether to work in a bare repository inside a working copy, too
    bool takesAnyBare = false;
};

/// Reads the arguments of the program.
class CommandLine
{
  public:
    CommandLine();
    CommandLine(const CommandLine &) = delete;
    CommandLine &operator=(const CommandLine &) = delete;
    ~CommandLine();

    /// Reads the arguments. To be called once.
    /// @return nothing if there is a command to run; otherwise the status to end with, after the
    ///         reason or the help was written
    /// @throws ShellFailure when the help can't be written
    std::optional<ExitStatus> parse(int argc, const char *const *argv, Output &output);

    const Settings &settings() const noexcept;
    /// The command to run.
    Command &command() const noexcept;

  private:
    void declareSettings();
    void declareCommands();
    std::optional<ExitStatus> help(const std::string &command, Output &output) const;
    /// The command that the line names, whatever is wrong with its arguments.
    const CLI::App *parsedCommand() const;
    std::string describe(const CLI::ParseError &error) const;
    std::string describeExtra() const;
    /// The text about an option on the wrong side of the command; empty if it is unknown there too.
    std::string describePlace(const CLI::App *command, const std::string &option) const;
    std::string describeMissing(const std::string &name) const;
    ExitStatus refuse(const std::string &reason) const;

    std::unique_ptr<CLI::App> line_;
    Settings settings_;
    std::vector<std::pair<CLI::App *, std::unique_ptr<Command>>> commands_;
    CLI::App *help_ = nullptr;
    Command *chosen_ = nullptr;
};

} // namespace vclink::shell
