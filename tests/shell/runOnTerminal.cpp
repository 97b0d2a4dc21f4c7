// SPDX-License-Identifier: MIT
#include "runOnTerminal.hpp"

namespace vclink::test
{

TerminalResult runOnTerminal(const std::vector<std::string> &arguments)
{
    return TerminalProcess(arguments).end();
}

} // namespace vclink::test
