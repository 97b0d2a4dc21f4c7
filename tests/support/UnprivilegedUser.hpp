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
/// Otherwise as runInChild().
std::string
runAsUnprivilegedUser(const std::function<std::string()> &action,
                      std::chrono::milliseconds timeout = std::chrono::milliseconds(60'000));

/// Makes the unprivileged user the owner of `path` and all below it, links themselves and not their
/// targets. Does nothing when the tests do not run as root.
void giveToUnprivilegedUser(const std::filesystem::path &path);

/// Whether the tests run as root, so that the unprivileged user is another one.
bool runsAsRoot() noexcept;

} // namespace vclink::test
