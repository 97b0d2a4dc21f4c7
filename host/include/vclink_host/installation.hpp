// SPDX-License-Identifier: MIT
#pragma once

#include "fl/ustring.hpp"
#include "vclink_host/export.hpp"

namespace vclink_host
{

/// Sets the result of fl::filesystem::get_install_path(). By default it is the folder in which this
/// library is installed, derived from the library's own path. Can be called from any thread.
VCLINK_HOST_EXPORT void setInstallPath(const ustring &folder);

} // namespace vclink_host
