// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "vclink_host/export.hpp"

namespace vclink_host
{

/// Enables these severities for the logger of this name, even if it is created later. Can be called
/// from any thread.
VCLINK_HOST_EXPORT void setEnabledSeverities(const std::string &loggerName, unsigned mask);

/// Returns the enabled severities of the logger of this name, 0 for an unused name.
VCLINK_HOST_EXPORT unsigned getEnabledSeverities(const std::string &loggerName);

} // namespace vclink_host
