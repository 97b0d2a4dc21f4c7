// SPDX-License-Identifier: MIT
#pragma once

namespace vclink::shell
{

/// From now on a log sink that throws loses its record and nothing else: the first time that is
/// reported. Without this the exception would leave the library's logger, and end the program where
/// the library writes a record in a destructor or a callback.
void surviveLogFailures();

} // namespace vclink::shell
