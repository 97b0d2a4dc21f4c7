// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>
#include <functional>
#include <string>

namespace vclink::test
{

/// Runs `action` in a child process, for what might never end, or must not be seen in this one.
/// @param action answers with what went wrong, an empty text if nothing did; an exception of it
///        counts as its text. Failures of GoogleTest's own assertions in it are not seen.
/// @return what `action` answered, or how else the child ended (a signal, no end within `timeout`)
/// @throws std::system_error when the child can't be made
std::string runInChild(const std::function<std::string()> &action,
                       std::chrono::milliseconds timeout = std::chrono::milliseconds(60'000));

} // namespace vclink::test
