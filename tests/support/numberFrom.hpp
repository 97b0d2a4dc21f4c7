// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <cstdlib>
#include <string>

namespace vclink::test
{

/// The number in an environment variable.
inline std::uint64_t numberFrom(const char *variable, std::uint64_t otherwise)
{
    const char *const text = std::getenv(variable);
    return text == nullptr ? otherwise : std::stoull(text);
}

} // namespace vclink::test
