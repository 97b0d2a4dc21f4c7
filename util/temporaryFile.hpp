// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>

#include <git2/index.h>

#include "fl/filesystem/path.hpp"

namespace vclink::git
{

/// A new file in the system's temporary folder with these bytes, for the caller to remove. A file
/// that can't be written, or not whole, goes unnoticed: the name comes back all the same. No link
/// is followed that somebody has put in its place.
/// @throws std::bad_alloc: no file is left then
[[nodiscard]] upath writeTemporaryFile(const void *data, std::size_t size);

/// writeTemporaryFile() with the content of the entry's blob. git_repository_odb, git_odb_read.
/// @throws LibGit2Exception when the blob can't be read
[[nodiscard]] upath writeBlobToTemporaryFile(const git_index_entry &entry,
                                             git_repository *repository);

/// Removes a file. A failure is reported to the log, and dropped.
void removeTemporaryFile(const upath &file) noexcept;

} // namespace vclink::git
