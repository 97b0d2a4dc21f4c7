// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <string>
#include <vector>

#include "vclink/git/BranchManager.hpp"
#include "vclink/git/GitRemoteHead.hpp"

namespace vclink::shell
{

/// What is pushed, and where to, by full names, which the back end needs.
struct PushRefspec
{
    /// empty to delete the target
    std::string source;
    std::string target;
    bool mayLoseCommits = false;

    std::string text() const;
    /// What was done, for a person.
    std::string describe(const std::string &remote) const;
};

/// Why nothing is pushed if no branch is the current one.
std::string noCurrentBranch();

/// A full name as people know it: "main" for "refs/heads/main".
std::string shortReference(const std::string &name);

/// Asks the remote for its references.
using AskHeads = std::function<std::vector<git::GitRemoteHead>()>;

/// Reads a refspec as git does: a short name is that of a branch, or else of a tag, and the target
/// has the name of the source if none is given.
/// @param currentBranch the short name; empty if there is none
/// @param askHeads called for a target that only the remote knows
/// @throws ShellFailure if a name is not unambiguous, or can't be completed
PushRefspec readPushRefspec(const git::BranchManager &manager, const std::string &refspec,
                            const std::string &currentBranch, const AskHeads &askHeads);

} // namespace vclink::shell
