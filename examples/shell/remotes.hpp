// SPDX-License-Identifier: MIT
#pragma once

#include <memory>
#include <optional>
#include <string>
#include <vector>

#include <CLI/CLI.hpp>

#include "fl/ustring.hpp"
#include "vclink/git/BranchManager.hpp"
#include "vclink/git/GitRemote.hpp"

namespace vclink::shell
{

class Session;

/// Which way commits go: git may be told of another remote for pushes.
enum class Direction
{
    Here,
    There
};

/// Declares the name of a remote, which may be left out.
CLI::Option *declareRemote(CLI::App &line);

/// The remote that is named. Otherwise that of the current branch, as git's settings have it, or
/// else "origin", or the only one.
std::string chooseRemote(Session &session, const CLI::Option &name, Direction direction);

/// The remote of the adapter's working copy. Its relative addresses are read from the root, as by
/// git, so that becomes the current folder.
/// @throws ShellFailure if there is no remote of this name, or nothing under its path
std::unique_ptr<git::GitRemote> openRemote(Session &session, const std::string &name,
                                           Direction direction);

/// Whether a remote has another address for pushes, whose references the back end cannot list.
bool pushesElsewhere(Session &session, const std::string &remote);

/// What git's settings say that is fetched from a remote or pushed to it.
std::vector<std::string> configuredRefspecs(Session &session, const std::string &remote,
                                            Direction direction);

/// The short name of the current branch; nothing before the first commit, or if none is.
std::optional<std::string> findCurrentBranch(const git::BranchManager &manager);

/// Whether an address is a path, as git reads it: a colon before the first slash ends a scheme or a
/// host.
bool isPath(const std::string &address);

std::string hexadecimal(const git::GitRemoteHead::Id &id);

std::vector<ustring> readRefspecs(const std::vector<std::string> &refspecs);

} // namespace vclink::shell
