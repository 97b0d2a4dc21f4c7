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
    /// A FIFO, a socket or a device: opening one may block for ever.
    Special
};

/// @param path absolute
/// @throws LibGit2Exception if that cannot be found out
Standing standingAt(const std::string &path);

/// Returns true if this is a folder that holds anything but folders, at any depth; true also if a
/// folder cannot be read.
/// @param path absolute
/// @throws LibGit2Exception if it cannot be found out what is at the path
bool holdsFiles(const std::string &path);

/// Returns what a link leads to, empty if it cannot be read.
/// @param path absolute
std::string readLink(const std::string &path);

} // namespace vclink::git
