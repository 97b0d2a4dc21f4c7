// SPDX-License-Identifier: MIT
#pragma once

#include <string>

namespace vclink::git
{

/// What is known of the exception in flight, for the log: seen as boost::exception and as
/// std::exception, verbose. The same text with every Boost for an exception that is neither. To be
/// called inside a handler.
std::string currentDiagnosticText();

} // namespace vclink::git
