// SPDX-License-Identifier: MIT
#pragma once

#include "fl/filesystem/path.hpp"
#include "fl/ustring.hpp"
#include "vclink_host/export.hpp"

namespace fl::filesystem
{

/// Whether something stands at `path`, links followed: a dangling link does not exist.
/// @throws boost::filesystem::filesystem_error when that can't be found out
VCLINK_HOST_EXPORT bool exists(const upath &path);

/// Removes a file or an empty folder; a link itself, not its target.
/// @return whether something was removed
/// @throws boost::filesystem::filesystem_error when it stands there and can't be removed
VCLINK_HOST_EXPORT bool remove(const upath &path);

/// A fresh name for a temporary file. The file is created, empty, with mode 0600, under a name that
/// can't be guessed, so that nobody else can take the name; no descriptor stays open. When the file
/// can't be created a fresh name comes back all the same, and nothing is raised but std::bad_alloc.
/// @param folder where; empty: the system's temporary folder
/// @param prefix what the name begins with; may be empty
/// @param extension what the name ends with, with or without its dot; may be empty
VCLINK_HOST_EXPORT ustring tmpnam(const ustring &folder, const ustring &prefix,
                                  const ustring &extension);

/// The root folder of the host's installation, without a trailing slash. See
/// vclink_host/installation.hpp.
VCLINK_HOST_EXPORT ustring get_install_path();

} // namespace fl::filesystem
