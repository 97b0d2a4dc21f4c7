// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

#include <CLI/CLI.hpp>

#include "texts.hpp"

/// The arguments of commands. They are read with CLI::Option::results(), which has them as given:
/// in the conversion to a list some versions of CLI11 take "{}" for an empty one. None may be
/// empty.
namespace vclink::shell
{

inline CLI::Option *refuseEmpty(CLI::Option *option)
{
    return option->type_name("")->check(
        [](const std::string &argument)
        { return argument.empty() ? say("must not be empty") : std::string(); });
}

/// Declares one name, of a branch, a revision or a file, at this place of a command's line.
inline CLI::Option *declareName(CLI::App &line, const std::string &label,
                                const std::string &description)
{
    return refuseEmpty(line.add_option_function<std::string>(
        label, [](const std::string & /*name*/) {}, description));
}

/// Declares any number of names at the end of a command's line.
inline CLI::Option *declareNames(CLI::App &line, const std::string &label,
                                 const std::string &description)
{
    return refuseEmpty(line.add_option_function<std::vector<std::string>>(
        label, [](const std::vector<std::string> & /*names*/) {}, description));
}

/// Declares any number of paths at the end of a command's line.
inline CLI::Option *declarePaths(CLI::App &line, const std::string &description)
{
    return declareNames(line, "PATH", description);
}

} // namespace vclink::shell
