// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <optional>
#include <string>
#include <vector>

namespace vclink::shell
{

/// A branch that a working copy of a repository has checked out, or to which it returns at the end
/// of a rebase or bisection.
struct CheckedOutBranch
{
    /// the short name
    std::string name;
    /// the root of the working copy
    std::filesystem::path root;
    bool isOwn;
};

/// The branches that the working copies of a repository have checked out. Those whose folders are
/// gone are left out.
/// @param root of the working copy that asks, whose branches are marked as its own
std::vector<CheckedOutBranch> findCheckedOutBranches(const std::filesystem::path &root);

/// The root of another working copy of the repository that has a branch checked out; nothing if
/// none has.
std::optional<std::filesystem::path> findOtherWorkingCopy(const std::filesystem::path &root,
                                                          const std::string &branch);

} // namespace vclink::shell
