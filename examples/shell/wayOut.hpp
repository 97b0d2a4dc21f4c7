// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <string>

#include "vclink/CMAdapter.hpp"
#include "vclink/git/GitError.hpp"

namespace vclink::shell
{

class Session;

/// Writes what to do about the current exception, if that is known: which lock was left, or how to
/// trust a repository of another user. Call it only in a handler.
void tellWayOut(Session &session);

/// If an operation with a remote failed because libgit2 does not support the format of the remote
/// repository, not of the working copy's own, says so.
/// @return whether that is the cause
bool tellRemoteFormat(Session &session, const git::GitError &failure);

/// Names the locks in a repository, and how old they are. If the user had no permission for a file
/// instead, which libgit2 reports with the same code, says so.
/// @param reason the text of the failure; if it names some of the locks, the others are left out
void tellLocks(CMAdapter &adapter, const std::string &reason);

/// Whether a text names a lock of the repository.
bool namesLock(CMAdapter &adapter, const std::string &text);

/// Where a repository says that it has a format which libgit2 does not support.
std::string explainFormat(const std::filesystem::path &folder);

/// How to open a repository of another user; empty if it belongs to the current user.
std::string explainOwner(const std::string &folder);

} // namespace vclink::shell
