// SPDX-License-Identifier: MIT
#pragma once

namespace vclink::shell
{

/// What the program ends with: one of these, or endedBy().
enum ExitStatus : int
{
    Done = 0,
    Failed = 1,
    WrongUsage = 2,
    /// as for Ctrl-C
    Cancelled = 130
};

/// The status of a program that a signal stopped, as shells show it: 130 for Ctrl-C, 143 for
/// SIGTERM, 129 for SIGHUP, 141 for SIGPIPE.
constexpr ExitStatus endedBy(int signal) noexcept
{
    return static_cast<ExitStatus>(128 + signal);
}

} // namespace vclink::shell
