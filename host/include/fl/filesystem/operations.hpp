// SPDX-License-Identifier: MIT
#pragma once

#include "fl/filesystem/path.hpp"
#include "fl/ustring.hpp"
#include "vclink_host/export.hpp"

namespace fl::filesystem
{

/// Returns true if something exists at `path`. Follows links: a link without a target does not
/// exist.
/// @throws boost::filesystem::filesystem_error if this cannot be found out
VCLINK_HOST_EXPORT bool exists(const upath &path);

/// Removes a file or an empty folder. Removes a link itself, not its target.
/// @return true if something was removed
/// @throws boost::filesystem::filesystem_error if it exists and cannot be removed
VCLINK_HOST_EXPORT bool remove(const upath &path);

/// Returns a new name for a temporary file. Creates the file, empty, with mode 0600, under a random
/// name, so that nobody else can use the name. Keeps no descriptor open. If the file cannot be
/// created, still returns a new name. Throws only std::bad_alloc.
/// @param folder the folder of the file; if empty, the system's temporary folder
/// @param prefix the beginning of the name; can be empty
/// @param extension the end of the name, with or without its dot; can be empty
VCLINK_HOST_EXPORT ustring tmpnam(const ustring &folder, const ustring &prefix,
                                  const ustring &extension);

/// Returns the root folder of the host's installation, without a trailing slash. See
/// vclink_host/installation.hpp.
VCLINK_HOST_EXPORT ustring get_install_path();

} // namespace fl::filesystem
