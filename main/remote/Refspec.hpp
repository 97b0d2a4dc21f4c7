// SPDX-License-Identifier: MIT
#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include <git2/net.h>
#include <git2/strarray.h>
#include <git2/types.h>

namespace vclink::git
{

constexpr std::string_view branchesFolder = "refs/heads/";
constexpr std::string_view tagsFolder = "refs/tags/";
constexpr std::string_view trackingFolder = "refs/remotes/";

/// Returns true if a reference is in a folder such as "refs/heads/".
bool isIn(std::string_view folder, std::string_view reference) noexcept;

/// A refspec as libgit2 reads it. libgit2 itself refuses texts that are none.
struct Refspec
{
    /// may have a "*"; empty in a push that deletes the target
    std::string source;
    /// the full name, with a "*" if the source has one; empty if a fetch stores nothing
    std::string target;
    /// begins with '+'
    bool isForced = false;

    bool isPattern() const noexcept;
    /// Returns true if it excludes what its source names, e.g. "^refs/heads/x".
    bool isNegative() const noexcept;
    /// Returns true if a target of this refspec can be in the folder.
    bool canReach(std::string_view folder) const noexcept;
    /// Returns the target for a reference of the source's side; nothing if the refspec does not
    /// have it.
    std::optional<std::string> findTarget(const std::string &reference) const;
};

Refspec readRefspec(std::string_view text, git_direction direction);

/// Returns the refspecs of the remote's configuration.
std::vector<Refspec> readConfiguredRefspecs(const git_remote *remote, git_direction direction);

/// Returns the refspecs that an operation uses: those that it is given, or else the configured
/// ones.
std::vector<Refspec> readEffectiveRefspecs(const git_remote *remote, const git_strarray &given,
                                           git_direction direction);

} // namespace vclink::git
