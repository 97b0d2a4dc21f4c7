// SPDX-License-Identifier: MIT
#pragma once

#include <string>

namespace vclink::git
{

/// Reads a file into `content`. A command that another thread starts while this runs does not
/// inherit the descriptor, as it would that of a stream. Does not wait for the writer of a FIFO.
/// @return 0, or the errno of the call that failed; `content` is then what was read before
[[nodiscard]] int readWholeFile(const std::string &path, std::string &content);

} // namespace vclink::git
