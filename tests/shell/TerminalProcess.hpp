// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <string>
#include <vector>

#include <sys/types.h>

namespace vclink::test
{

struct TerminalResult
{
    /// the number of a signal that ended the program, negative
    int exitStatus = 0;
    /// all that appeared on the terminal, lines ending with a line feed
    std::string text;
};

/// A program with a terminal of its own as its standard input, output and error, in a session of
/// its own; killed at the end if it has not ended. What it writes is held up after some thousand
/// bytes, until it is read.
class TerminalProcess
{
  public:
    /// @param arguments the program, found in PATH unless it has a slash, and its arguments
    /// @throws std::system_error when there is no terminal to be had
    explicit TerminalProcess(std::vector<std::string> arguments,
                             const std::filesystem::path &folder = {});
    TerminalProcess(const TerminalProcess &) = delete;
    TerminalProcess &operator=(const TerminalProcess &) = delete;
    ~TerminalProcess();

    /// Reads until this text has appeared, and no more than is already there.
    /// @throws std::runtime_error when it has not within a minute, or the program has ended
    void readUntil(const std::string &text);
    /// Sends SIGINT to the program, and to nobody else.
    void interrupt() const;
    /// Sends a signal to the program, and to nobody else.
    void send(int signal) const;

    /// Reads until nobody holds the terminal any more, and waits for the end of the program.
    /// @throws std::runtime_error when the reading takes more than a minute
    TerminalResult end();

  private:
    /// @return false at the end
    bool readMore();

    int terminal_ = -1;
    pid_t process_ = 0;
    std::string text_;
};

} // namespace vclink::test
