// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "vclink_host/export.hpp"

namespace vclink_host
{

/// Enables these severities for the logger of this name, also when it comes into being later.
/// May be called from any thread.
VCLINK_HOST_EXPORT void setEnabledSeverities(const std::string &loggerName, unsigned mask);

/// What is enabled for the logger of this name; 0 for a name that nobody has used.
VCLINK_HOST_EXPORT unsigned getEnabledSeverities(const std::string &loggerName);

} // namespace vclink_host
