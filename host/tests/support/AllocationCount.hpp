// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>

namespace vclink_host_tests
{

/// How often the calling thread has taken memory through operator new, which this program replaces.
std::size_t getAllocationCount() noexcept;

} // namespace vclink_host_tests
