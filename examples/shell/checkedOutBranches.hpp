// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <optional>
#include <string>
#include <vector>

namespace vclink::shell
{

/// A branch that a working copy of a repository has checked out, or to which it returns at the end
/// of a rebase or bisection, or that a rebase moves then.
struct CheckedOutBranch
{
    /// the short name
    std::string name;
    /// the root of the working copy, which may be gone; empty if it is unknown
    std::filesystem::path root;
    bool isOwn;
    /// whether a rebase moves it in the end (`--update-refs`), and a working copy may switch to it
    bool isMoved;
};

/// The branches that the working copies of a repository have checked out, also those whose folders
/// are gone.
/// @param root of the working copy that asks, whose branches are marked as its own
std::vector<CheckedOutBranch> findCheckedOutBranches(const std::filesystem::path &root);

/// Where another working copy of the repository has a branch checked out; nothing if none has.
std::optional<CheckedOutBranch> findOtherWorkingCopy(const std::filesystem::path &root,
                                                     const std::string &branch);

/// @throws ShellFailure if the working copy's folder is missing: the branch is still its own
void refuseMissingFolder(const CheckedOutBranch &branch);

/// The working copy of a branch, to follow "in".
std::string showPlace(const CheckedOutBranch &branch);

} // namespace vclink::shell
