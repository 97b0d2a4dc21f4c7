// SPDX-License-Identifier: MIT
#include "commands.hpp"

namespace vclink::shell
{

Command::~Command() = default;

const std::vector<CommandEntry> &commandTable()
{
    static const std::vector<CommandEntry> table{
        {"status", "Show the state of files", makeStatusCommand},
        {"probe", "Tell whether a folder is a working copy or repository that can be served",
         makeProbeCommand},
        {"version", "Show the versions of this program and of libgit2", makeVersionCommand}};
    return table;
}

} // namespace vclink::shell
