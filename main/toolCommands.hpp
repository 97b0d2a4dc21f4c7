// SPDX-License-Identifier: MIT
#pragma once

#include <optional>
#include <string>

#include "fl/ustring.hpp"

/// The host's tools as Git's configuration names them.
namespace vclink::git
{

/// The key of a value in Git's configuration.
struct ConfigKey
{
    std::string section;
    std::optional<std::string> subsection;
    std::string name;
};

/// One tool: where its command stands, which launcher it starts, and with what.
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

/// section.subsection.name, or section.name.
std::string configKeyString(const ConfigKey &key);

/// The launcher's place below the host's place of installation, with forward slashes, UTF-8.
std::string toolLauncherPath(const ToolCommand &tool);

/// The launcher in double quotes, a blank and the arguments. A double quote in the launcher is not
/// escaped.
std::string quotedCommand(const std::string &launcher, const std::string &arguments);

} // namespace vclink::git
