// SPDX-License-Identifier: MIT
#pragma once

#include <optional>
#include <string>

#include <QString>

#include "fl/filesystem/path.hpp"

/// Asks the git program for what the library does not report: the author of commits, and the three
/// versions of a file in conflict. The functions wait for git: call them on the worker's thread.
namespace vclink::desktop
{

/// The author of the next commit as the library finds it, "Name <address>"; empty where there is
/// none.
QString findAuthor(const upath &root);

/// The versions of a file in conflict, in bytes; nothing for a side that has no such file.
struct Sides
{
    std::optional<std::string> ancestor;
    std::optional<std::string> ours;
    std::optional<std::string> theirs;
};

/// Nothing at all if git is missing or too old.
Sides readSides(const upath &root, const upath &file);

} // namespace vclink::desktop
