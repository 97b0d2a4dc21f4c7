// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <functional>
#include <string>
#include <vector>

#include "names.hpp"
#include "vclink/CMAdapter.hpp"
#include "vclink/FileStateMap.hpp"

namespace vclink::shell
{

/// Something that the person named on the command line.
struct NamedPath
{
    /// as it was given
    std::string argument;
    /// absolute
    upath path;
    /// all files below a folder, or the file itself; nothing that Git does not know
    FileStateMap states;
    /// whether the states are those of files below a folder
    bool isFolder = false;
    /// whether the back end would follow a symbolic link, see isFollowed()
    bool isLink = false;
};

/// What was named, with the states of all files below the folders. Asks for each folder separately.
/// A folder without files of its own may be a submodule, which is one entry, and counts as a file.
/// @throws ShellFailure, and what the back end throws
std::vector<NamedPath> lookUpFolders(CMAdapter &adapter, const std::vector<std::string> &arguments);

/// As lookUpFolders(), with the states of the files too, and with paths as Git has them: a symbolic
/// link means itself, not its target. A name that acts as a pattern adds no other file.
/// @throws ShellFailure also if the states of files can't be known
std::vector<NamedPath> lookUp(CMAdapter &adapter, const std::vector<std::string> &arguments);

/// The states of these files. Many names are looked up in the states of the whole working copy: the
/// back end compares each name with each file, which takes longer.
FileStateMap statesOf(CMAdapter &adapter, const std::vector<upath> &files);

/// Whether the back end can get a file by its name: it treats a backslash as a slash.
bool isAddressable(const upath &path, const upath &root);

/// Whether the name of a folder, relative to the root, means everything below it. Other names are
/// patterns, or become patterns in the library.
bool meansAllBelow(const ustring &name);

/// The files whose state `isMeant` holds for.
FileStateMap filter(const FileStateMap &states,
                    const std::function<bool(FileState::State)> &isMeant);

/// For a message: each file as it is typed in the current folder, on an indented line after a line
/// feed.
std::string listNames(const FileStateMap &states);

/// Whether a name, relative to the root, acts as a pattern in the back end.
bool isPattern(const ustring &name);

/// The same files under names that match no other file: special characters are put in brackets. A
/// name stays as it is if the name with brackets is another file's.
std::vector<upath> literalNames(const std::vector<upath> &files, const upath &root);

/// The files that the back end can get by their names.
std::vector<upath> addressable(const FileStateMap &states, const upath &root);

} // namespace vclink::shell
