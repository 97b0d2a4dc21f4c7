// SPDX-License-Identifier: MIT
#pragma once

#include <optional>
#include <string>

#include "main/checkout/standing.hpp"

namespace vclink::git
{

/// The reason to refuse a checkout.
struct Obstacle
{
    std::string path;
    /// what is in the way, and how to remove it if that is not obvious
    std::string text;
};

/// The result of a rule: nothing if it does not object.
using Finding = std::optional<Obstacle>;

/// Something that the checkout would write to, delete or fail at.
Obstacle inTheWay(const std::string &name, Standing standing);

/// The same in a folder that becomes a file.
Obstacle inChangedFolder(const std::string &name, Standing standing);

/// What is staged would be overwritten.
Obstacle stagedChangesOf(const std::string &name);

/// An edit of a tracked file; a merge would overwrite or commit it.
Obstacle editBeforeMerge(const std::string &name);

/// An edit of a tracked file may exist, and be lost.
Obstacle unreadableFile(const std::string &name);

/// Makes the text libgit2's last error, and returns GIT_ECONFLICT, for a callback.
int reportConflict(const Obstacle &obstacle);

} // namespace vclink::git
