// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

#include <CLI/CLI.hpp>

namespace vclink::shell
{

/// Declares any number of paths at the end of a command's line. They are read with
/// CLI::Option::results(), which has them as given: in the conversion to a list some versions of
/// CLI11 take "{}" for an empty one.
inline CLI::Option *declarePaths(CLI::App &line, const std::string &description)
{
    return line
        .add_option_function<std::vector<std::string>>(
            "PATH", [](const std::vector<std::string> & /*paths*/) {}, description)
        ->type_name("")
        ->check([](const std::string &path)
                { return path.empty() ? std::string("it may not be empty") : std::string(); });
}

} // namespace vclink::shell
