// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>
#include <string>

#include "util/scope/FileDescriptor.hpp"

namespace vclink::git
{

/// Writes all of the data, with several calls of write(2) if the first one writes only a part.
/// @return 0, or the errno of the call that failed
[[nodiscard]] int writeAll(const FileDescriptor &file, const char *data, std::size_t size) noexcept;

/// Creates a file with this text. If it cannot be created, for example because it exists, what is
/// at the path stays; if it cannot be written, it is removed again.
/// @return 0, or the errno of the call that failed, EEXIST for a file that exists
[[nodiscard]] int createFile(const std::string &path, const std::string &text) noexcept;

} // namespace vclink::git
