// SPDX-License-Identifier: MIT
#pragma once

/// Registers a merge driver under "*" that does no more than it must: it writes the three sides to
/// files, forks, executes the tool that BENCH_TOOL names ("TOOL ANCESTOR OURS THEIRS OURS"), or
/// "cp THEIRS OURS", and reads ours back.
void registerFloorDriver(void);
