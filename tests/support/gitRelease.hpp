// SPDX-License-Identifier: MIT
#pragma once

#include <sstream>

#include "support/Command.hpp"

/// Differences between releases of git that a test depends on, a line each; libgit2Release.hpp has
/// those of libgit2. The release is that of the git that the tests run.
namespace vclink::test::git_release
{

inline bool isSince(int major, int minor)
{
    std::istringstream version(Command({"git", "--version"}).run().output);
    std::string word;
    int ours = 0;
    int oursMinor = 0;
    char point = '.';
    version >> word >> word >> ours >> point >> oursMinor;
    return ours > major || (ours == major && oursMinor >= minor);
}

/// A merge driver that a signal ends, or that ends with a status above 128, ends the whole merge.
/// Earlier releases count it as a conflict.
inline bool driverCanEndMerge()
{
    return isSince(2, 42);
}

/// An empty command of a merge driver ends the whole merge. Later releases count it as a conflict,
/// as any command that cannot be started.
inline bool emptyDriverEndsMerge()
{
    return !isSince(2, 42);
}

/// A folder with nothing but ignored files is deleted if a file comes in its place. Earlier
/// releases refuse. 2.39 and 2.47 were tried.
inline bool deletesIgnoredFolders()
{
    return isSince(2, 47);
}

} // namespace vclink::test::git_release
