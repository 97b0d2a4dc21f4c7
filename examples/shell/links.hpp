// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <optional>

#include "fl/filesystem/path.hpp"
#include "vclink/FileStateMap.hpp"

/// Symbolic links in the working copy. For Git each is an entry of its own. The back end follows
/// them, and would act on their targets.
namespace vclink::shell
{

/// The path under which Git knows a file: links in the path of the root are resolved, those in the
/// working copy are not.
/// @param path absolute
/// @throws std::filesystem::filesystem_error
upath entryForm(const std::filesystem::path &path, const upath &root);

/// Whether the back end would follow a link if it gets this path below the root: the path itself or
/// a folder above it is a link. It does not follow a link without a target.
bool isFollowed(const upath &entry, const upath &root);

/// The files with a path that would be followed, or the others.
FileStateMap filterFollowed(const FileStateMap &states, const upath &root, bool areFollowed);

/// A pattern, as a path, that matches only the entry at a path that would be followed. The back end
/// cannot follow a pattern, because no file has its text as a name. Returns nothing if the name has
/// special characters. Only for operations that do not look up the states first.
std::optional<upath> patternForEntry(const upath &entry, const upath &root);

} // namespace vclink::shell
