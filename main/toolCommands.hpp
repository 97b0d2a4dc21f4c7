// SPDX-License-Identifier: MIT
#pragma once

#include <optional>
#include <string>

#include "fl/ustring.hpp"

/// The host's tools in Git's configuration.
namespace vclink::git
{

/// The key of a value in Git's configuration.
struct ConfigKey
{
    std::string section;
    std::optional<std::string> subsection;
    std::string name;
};

/// One tool: the key of its command, its launcher and the arguments.
struct ToolCommand
{
    ConfigKey key;
    ustring launcher;
    /// Replaces the launcher's extension unless it is empty.
    ustring extension;
    std::string arguments;
};

ToolCommand autoMergeDriver();
ToolCommand mergeTool();
ToolCommand diffTool();

/// Returns section.subsection.name, or section.name.
std::string configKeyString(const ConfigKey &key);

/// Returns the launcher's path below the host's installation folder, with forward slashes, UTF-8.
std::string toolLauncherPath(const ToolCommand &tool);

/// Returns the launcher in double quotes, a blank and the arguments. Does not escape a double quote
/// in the launcher.
std::string quotedCommand(const std::string &launcher, const std::string &arguments);

} // namespace vclink::git
