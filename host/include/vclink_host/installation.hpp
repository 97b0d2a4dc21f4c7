// SPDX-License-Identifier: MIT
#pragma once

#include "fl/ustring.hpp"
#include "vclink_host/export.hpp"

namespace vclink_host
{

/// Sets what fl::filesystem::get_install_path() gives from now on. At the start it is the folder
/// that this library was installed under, found from where the library lies. May be called from
/// any thread.
VCLINK_HOST_EXPORT void setInstallPath(const ustring &folder);

} // namespace vclink_host
