// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <optional>

#include "fl/filesystem/path.hpp"
#include "vclink/FileStateMap.hpp"

/// Symbolic links in the working copy. To Git each is an entry of its own; the back end follows the
/// names it is given, and would act on what they lead to.
namespace vclink::shell
{

/// The path under which Git knows what was named: links above the root and up to it are resolved,
/// those in the working copy are not.
/// @param path absolute
/// @throws std::filesystem::filesystem_error
upath entryForm(const std::filesystem::path &path, const upath &root);

/// Whether the back end, told of this path below the root, would follow a link, at the path itself
/// or at a folder above it. A link that leads nowhere is not followed.
bool isFollowed(const upath &entry, const upath &root);

/// Those of the files that are told of by a path that would be followed, or the others.
FileStateMap filterFollowed(const FileStateMap &states, const upath &root, bool areFollowed);

/// A pattern, as a path, that means to the back end just the entry at a path that would be
/// followed: what does not exist by its very name can't be. None where the name is odd itself. Only
/// for calls that do not look up the states first, to name the files that they find.
std::optional<upath> patternForEntry(const upath &entry, const upath &root);

} // namespace vclink::shell
