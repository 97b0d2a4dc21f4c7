// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "support/Command.hpp"

namespace vclink::test
{

/// Runs a program that has to succeed.
/// @return what it wrote to standard output
/// @throws std::runtime_error with its words when it fails
std::string runOrThrow(const Command &command);

} // namespace vclink::test
