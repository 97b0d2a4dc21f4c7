// SPDX-License-Identifier: MIT
#pragma once

#include <string>

namespace vclink::git
{

/// What is at a path. Links are not followed, and nothing is opened.
enum class Standing
{
    Nothing,
    File,
    Link,
    Folder,
    /// A FIFO, a socket or a device: opening one can block forever.
    Special
};

/// @param path absolute
/// @throws LibGit2Exception if it cannot be found out
Standing standingAt(const std::string &path);

/// Returns true if this is a folder that contains anything except folders, at any depth, or that
/// cannot be read.
/// @param path absolute
/// @throws LibGit2Exception if the path cannot be examined
bool holdsFiles(const std::string &path);

/// Returns the target of a link, empty if it cannot be read.
/// @param path absolute
std::string readLink(const std::string &path);

} // namespace vclink::git
