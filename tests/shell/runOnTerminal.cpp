// SPDX-License-Identifier: MIT
#include "runOnTerminal.hpp"

#include <sys/wait.h>

#include "TerminalProcess.hpp"

namespace vclink::test
{

TerminalResult runOnTerminal(const std::vector<std::string> &arguments)
{
    TerminalProcess process(arguments);
    TerminalResult result;
    result.text = process.readAll();
    const int status = process.wait();
    result.exitStatus = WIFEXITED(status) ? WEXITSTATUS(status) : -1;
    return result;
}

} // namespace vclink::test
