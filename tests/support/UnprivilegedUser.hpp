// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>
#include <filesystem>
#include <functional>
#include <string>

namespace vclink::test
{

/// Runs `action` in a child process that has no privileges: as the user and group "nobody" when the
/// tests run as root, otherwise as who runs them. For what root is never refused.
/// @param action answers with what went wrong, an empty text if nothing did; an exception of it
///        counts as its text. Failures of GoogleTest's own assertions in it are not seen.
/// @return what `action` answered, or how else the child ended (a signal, no end within `timeout`)
/// @throws std::system_error when the child can't be made
std::string
runAsUnprivilegedUser(const std::function<std::string()> &action,
                      std::chrono::milliseconds timeout = std::chrono::milliseconds(60'000));

/// Makes the unprivileged user the owner of `path` and all below it, links themselves and not their
/// targets. Does nothing when the tests do not run as root.
void giveToUnprivilegedUser(const std::filesystem::path &path);

/// Whether the tests run as root, so that the unprivileged user is another one.
bool runsAsRoot() noexcept;

} // namespace vclink::test
