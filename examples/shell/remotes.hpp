// SPDX-License-Identifier: MIT
#pragma once

#include <memory>
#include <vector>

#include <CLI/CLI.hpp>

#include "fl/ustring.hpp"
#include "vclink/git/GitRemote.hpp"

namespace vclink::shell
{

class Session;

/// Declares the name of a remote at this place of a command's line.
CLI::Option *declareRemote(CLI::App &line);

/// The remote of this name in the working copy that the current folder lies in. The root of that
/// becomes the current folder: a remote whose address is a relative path is found from there, as by
/// git, and libgit2 looks from the current folder.
/// @throws ShellFailure when the current folder lies in no working copy
std::unique_ptr<git::GitRemote> openRemote(Session &session, const CLI::Option &name);

std::vector<ustring> readRefspecs(const CLI::Option &option);

} // namespace vclink::shell
