// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <map>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "MemoryFile.hpp"

/// Asks the git program, if it is installed, for what the library does not report.
namespace vclink::shell
{

/// Runs a program, without git's own variables in its environment, in the program's language.
/// Ctrl-C does not reach it.
/// @return nothing if it has ended with status 0, otherwise what it wrote to its standard error
std::optional<std::string> runProgram(std::vector<std::string> words, const MemoryFile &in,
                                      const MemoryFile &out);

/// The words for git with these arguments, in a folder. It reads its configuration.
std::vector<std::string> gitWords(const std::filesystem::path &folder,
                                  const std::vector<std::string> &arguments);

/// Runs git in a working copy.
/// @param input what git reads; nothing by default
/// @return what git wrote to its standard output; nothing if it failed or is not installed
std::optional<std::string> runGit(const std::filesystem::path &folder,
                                  const std::vector<std::string> &arguments,
                                  std::string_view input = {});

/// The parts of an output of git, each of which ends with a NUL.
std::vector<std::string> splitAtNul(const std::string &text);

/// Git's settings of branches and remotes, by their full names as git lists them; the last value of
/// each.
std::map<std::string, std::string> readRemoteSettings(const std::filesystem::path &folder);

} // namespace vclink::shell
