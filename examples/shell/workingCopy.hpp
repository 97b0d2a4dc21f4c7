// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>

#include "vclink/CMAdapter.hpp"
#include "vclink/FileStateMap.hpp"

/// What the back end does not report about a working copy.
namespace vclink::shell
{

/// Whether a folder has an entry ".git"; a bare repository has none.
bool hasGitEntry(const std::filesystem::path &folder);

/// The folder in which Git keeps the state of a working copy.
/// @param root of the working copy
std::filesystem::path stateFolder(const std::filesystem::path &root);

/// The folder with everything that all working copies of a repository share.
/// @param state of one of them, as from stateFolder(), or a bare repository
std::filesystem::path sharedFolder(const std::filesystem::path &state);

/// If the commit of HEAD or its tree can't be read, the back end reports each file as added.
/// @throws ShellFailure in that case
void refuseUnreadableHead(CMAdapter &adapter);

/// The states of all files of the working copy.
/// @throws ShellFailure if they can't be known
FileStateMap wholeStates(CMAdapter &adapter);

/// If libgit2 can't read a working copy, the back end reports no file at all, which looks like a
/// working copy without changes.
/// @throws ShellFailure in that case; call it if a query returned no states
void refuseUnknownStates(CMAdapter &adapter);

} // namespace vclink::shell
