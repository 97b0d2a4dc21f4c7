// SPDX-License-Identifier: MIT
#pragma once

namespace vclink::shell
{

/// What the program ends with. The number of a person's cancellation is that of a program which
/// ended by SIGINT, as shells show it.
enum ExitStatus : int
{
    Done = 0,
    Failed = 1,
    WrongUsage = 2,
    Cancelled = 130
};

} // namespace vclink::shell
