// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <string_view>

namespace vclink::shell
{

/// Standard output. Text is collected and written in large pieces; what is not flushed is lost.
class Output
{
  public:
    Output();
    Output(const Output &) = delete;
    Output &operator=(const Output &) = delete;
    ~Output() = default;

    /// On a terminal, characters that change the direction of writing are escaped.
    /// @throws OutputClosed, ShellFailure when standard output can't be written
    void write(std::string_view text);
    /// As write(), byte for byte.
    void writeRaw(std::string_view text);
    /// @throws OutputClosed, ShellFailure when standard output can't be written; nothing is left to
    /// flush then
    void flush();

    /// Whether the output is a terminal on which colours are wanted.
    bool hasColour() const noexcept;

  private:
    std::string text_;
    bool isTerminal_;
    bool hasColour_;
};

/// Whether standard error is a terminal.
bool errorsAreOnTerminal() noexcept;

/// Whether it is a terminal on which a line can be drawn again and again.
bool errorsCanBeRedrawn() noexcept;

/// Writes a line about what was done to standard error, only if that is a terminal.
void remark(const std::string &text);

/// Lets the program continue if nobody reads its output or its messages any more, as in a pipe to
/// "head": a merge must not end in the middle of its writing. The signal still ends programs that
/// this one starts. If the signal was ignored before, it stays ignored.
void surviveClosedPipes();

/// Opens standard input, output and error if they are closed, so that no later file gets one of
/// their numbers and receives their data. If one was closed, using it still fails.
void holdStandardDescriptors();

} // namespace vclink::shell
