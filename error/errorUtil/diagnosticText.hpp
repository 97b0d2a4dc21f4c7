// SPDX-License-Identifier: MIT
#pragma once

#include <string>

namespace vclink::git
{

/// Describes the exception in flight for the log, verbosely, as a boost::exception and as a
/// std::exception. For an exception that is neither, the text is the same with every Boost. Call it
/// inside a handler.
std::string currentDiagnosticText();

} // namespace vclink::git
