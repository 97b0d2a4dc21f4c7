// SPDX-License-Identifier: MIT
#pragma once

#include <vector>

#include "fl/filesystem/path.hpp"
#include "fl/ustring.hpp"
#include "vclink_host/export.hpp"

namespace vclink::util
{

/// Returns the files as text for a message: one path on each line, in the list's order, without a
/// line feed at the end.
VCLINK_HOST_EXPORT ustring generateFileReport(std::vector<upath> files);

} // namespace vclink::util
