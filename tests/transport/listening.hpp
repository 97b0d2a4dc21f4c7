// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

#include <sys/types.h>

namespace vclink::test
{

/// Ports of 127.0.0.1, all different, that nobody uses just now.
/// @throws std::system_error
std::vector<std::uint16_t> freePorts(std::size_t count);

/// Whether this very process listens on all the ports of 127.0.0.1. Says nothing to the process:
/// neither a try connection confuses it, nor does a foreign process on the same port count.
bool listensOn(pid_t process, const std::vector<std::uint16_t> &ports);

} // namespace vclink::test
