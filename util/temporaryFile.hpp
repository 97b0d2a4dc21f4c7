// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>

#include <git2/index.h>

#include "fl/filesystem/path.hpp"

namespace vclink::git
{

/// Writes these bytes to a new file in the system's temporary folder, and returns its name. The
/// caller removes the file. Does not follow a link in its place. Returns the name even if the file
/// was not written, or not completely.
/// @throws std::bad_alloc; then no file is left
[[nodiscard]] upath writeTemporaryFile(const void *data, std::size_t size);

/// Calls writeTemporaryFile() with the content of the entry's blob. git_repository_odb,
/// git_odb_read.
/// @throws LibGit2Exception if the blob cannot be read
[[nodiscard]] upath writeBlobToTemporaryFile(const git_index_entry &entry,
                                             git_repository *repository);

/// Removes a file. Logs and ignores a failure.
void removeTemporaryFile(const upath &file) noexcept;

} // namespace vclink::git
