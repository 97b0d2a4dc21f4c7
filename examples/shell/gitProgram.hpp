// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <map>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

/// What the library does not give out is asked of the git program, as far as it is installed.
namespace vclink::shell
{

/// Runs git. It reads its configuration, and of its own variables of the environment only those
/// that are given here.
/// @param folder the working copy
/// @param input what git reads; nothing by default
/// @param variables of the environment, NAME=VALUE
/// @return what git wrote to its standard output; nothing if it failed or is not installed
std::optional<std::string> runGit(const std::filesystem::path &folder,
                                  std::vector<std::string> arguments, std::string_view input = {},
                                  const std::vector<std::string> &variables = {});

/// Git's settings of branches and remotes, by their full names as git lists them; the last value of
/// each.
std::map<std::string, std::string> readRemoteSettings(const std::filesystem::path &folder);

} // namespace vclink::shell
