// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include <git2/types.h>

namespace vclink::git
{

/// What libgit2 does at a line of a file with patterns of ignored files.
enum class PatternFault
{
    None,
    /// It reads a null pointer.
    EndsProcess,
    /// It reads the line again and again.
    NeverEnds
};

struct FatalPattern
{
    PatternFault fault = PatternFault::None;
    /// of the line, from 1
    int number = 0;
};

/// Finds the first such line.
/// @param text of a `.gitignore` in the root of a working tree, or of `.git/info/exclude`; in other
/// folders libgit2 does not read a null pointer
FatalPattern findFatalPattern(const std::string &text);

/// Refuses a working copy if one of the two files has such a line: whoever made the repository
/// could end the host, or keep an operation from ending. For operations that look for untracked or
/// ignored files. A file that cannot be read counts as empty, as for libgit2.
/// @throws LibGit2Exception that names the file and the line
void refuseFatalPatterns(git_repository *repository);

} // namespace vclink::git
