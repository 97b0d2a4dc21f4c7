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
/// else "origin".
std::string chooseRemote(Session &session, const CLI::Option &name, Direction direction);

/// The remote of the adapter's working copy. Its relative addresses are read from the root, as by
/// git, so that becomes the current folder.
std::unique_ptr<git::GitRemote> openRemote(Session &session, const std::string &name);

/// Whether git's settings say what is pushed to a remote.
bool isPushConfigured(Session &session, const std::string &remote);

/// The short name of the current branch; nothing before the first commit, or if none is.
std::optional<std::string> findCurrentBranch(const git::BranchManager &manager);

std::string hexadecimal(const git::GitRemoteHead::Id &id);

std::vector<ustring> readRefspecs(const std::vector<std::string> &refspecs);

} // namespace vclink::shell
