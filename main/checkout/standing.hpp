// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <string>

#include <sys/stat.h>

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

/// @param status receives what lstat says; zeros for nothing
Standing standingAt(const std::string &path, struct stat &status);

/// Returns true if this is a folder that contains anything except folders, at any depth, or that
/// cannot be read.
/// @param path absolute
/// @throws LibGit2Exception if the path cannot be examined
bool holdsFiles(const std::string &path);

/// Visits what is in a folder, except "." and "..", until the visitor returns false.
/// @param path absolute
/// @param visitor receives the name; can throw
/// @return false if the folder cannot be read
bool visitFolder(const std::string &path, const std::function<bool(const std::string &)> &visitor);

/// Returns the nearest folder above a path, with a slash at its end, if the process may not create
/// and remove files in it. Empty if it may.
/// @param path absolute
std::string unwritableFolderAbove(const std::string &path);

/// Returns true if the folder can be read and contains nothing.
/// @param path absolute
bool isEmptyFolder(const std::string &path);

/// Returns the target of a link, empty if it cannot be read.
/// @param path absolute
std::string readLink(const std::string &path);

} // namespace vclink::git
