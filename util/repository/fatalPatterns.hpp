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

/// Where the patterns are.
enum class PatternPlace
{
    /// a `.gitignore` in the root of a working tree, or `.git/info/exclude`
    Root,
    /// a `.gitignore` of another folder, in which no line makes libgit2 read a null pointer
    Folder
};

/// Finds the first such line.
FatalPattern findFatalPattern(const std::string &text, PatternPlace place = PatternPlace::Root);

/// Refuses a working copy if one of the two files has such a line: whoever made the repository
/// could end the host, or keep an operation from ending. For operations that look for untracked or
/// ignored files. A file that cannot be read counts as empty, as for libgit2; a FIFO is refused,
/// too.
/// @throws LibGit2Exception that names the file and the line
void refuseFatalPatterns(git_repository *repository);

/// Refuses the same in submodules, which libgit2 looks into to know whether they have changed, and
/// in the folders of both, if their `.gitignore` is tracked: others are only found by a walk, and
/// libgit2's does not end.
/// @param index of the repository
/// @throws LibGit2Exception that names the file and the line
void refuseFatalPatternsInFolders(git_repository *repository, git_index *index);

/// The same with the index as it is now; if it cannot be read, nothing is refused.
void refuseFatalPatternsInFolders(git_repository *repository);

} // namespace vclink::git
