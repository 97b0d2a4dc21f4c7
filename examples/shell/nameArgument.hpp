// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

#include <CLI/CLI.hpp>

namespace vclink::shell
{

/// Lets no empty argument through.
inline CLI::Option *refuseEmpty(CLI::Option *option)
{
    return option->type_name("")->check(
        [](const std::string &name)
        { return name.empty() ? std::string("it may not be empty") : std::string(); });
}

/// Declares one name, of a branch, a revision or a file, at this place of a command's line. It is
/// read as the paths of declarePaths() are.
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

} // namespace vclink::shell
