// SPDX-License-Identifier: MIT
#pragma once

#include <exception>
#include <stdexcept>
#include <string>

#include "exitStatus.hpp"

namespace vclink::shell
{

/// What the shell itself can't do. The text is for the person at the terminal, in any bytes.
class ShellFailure : public std::runtime_error
{
  public:
    using std::runtime_error::runtime_error;
};

/// Nobody reads standard output any more.
class OutputClosed : public std::exception
{
  public:
    const char *what() const noexcept override
    {
        return "Standard output is closed.";
    }
};

/// Writes a line, or a few, to standard error, under the program's name.
void complain(const std::string &text);

/// Writes a line, or a few, to standard error: what a person needs later, also from a script.
void inform(const std::string &text);

/// Writes what a server says to standard error, each line marked as the server's.
void relay(const std::string &text);

/// Writes the text of the current exception to standard error, localized if it has such a text.
/// Writes nothing for OutputClosed. Call it only in a handler.
/// @return the status to end with
ExitStatus reportFailure();

} // namespace vclink::shell
