// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>
#include <filesystem>
#include <map>
#include <optional>
#include <string>
#include <vector>

namespace vclink::test
{

/// What a program left behind.
struct CommandResult
{
    /// -1 when a signal ended the program
    int exitStatus = -1;
    /// the signal that ended the program, or 0
    int signal = 0;
    /// whether the program took too long and was killed
    bool timedOut = false;
    /// what the program wrote to standard output and to standard error, byte by byte
    std::string output;
    std::string errors;

    bool succeeded() const noexcept
    {
        return exitStatus == 0;
    }
};

/// A program to run, without a shell. It reads and writes plain files in memory, so nothing it or a
/// child left behind does can block the run.
class Command
{
  public:
    /// @param arguments the program, found in PATH unless it has a slash, and its arguments
    explicit Command(std::vector<std::string> arguments);

    Command &in(std::filesystem::path folder);
    Command &environment(const std::string &name, std::string value);
    Command &withoutEnvironment(const std::string &name);
    /// What the program reads from standard input; nothing unless given.
    Command &input(std::string bytes);
    /// How long the program may take; 60 s unless given.
    Command &timeout(std::chrono::milliseconds time);

    /// Runs the program to its end, in a process group of its own. A group that takes too long is
    /// killed. May be called again.
    /// @throws std::system_error when the program can't be started or watched
    CommandResult run() const;
    /// As run(), for a program that has to succeed.
    /// @return what it wrote to standard output
    /// @throws std::runtime_error with its words when it fails
    std::string runOrThrow() const;

    /// The arguments separated by blanks, for messages.
    std::string text() const;

  private:
    std::vector<std::string> makeEnvironment() const;

    std::vector<std::string> arguments_;
    std::filesystem::path folder_;
    std::map<std::string, std::optional<std::string>> environment_;
    std::string input_;
    std::chrono::milliseconds timeout_{60'000};
};

} // namespace vclink::test
