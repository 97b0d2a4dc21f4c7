// SPDX-License-Identifier: MIT
#include "ShellInteractor.hpp"

namespace vclink::shell
{

void SilentProgressReporter::setProgress(double /*fraction*/)
{
}

void SilentProgressReporter::setProgressMessage(const ustring & /*message*/)
{
}

Terminator &ShellInteractor::getTerminator()
{
    return terminator_;
}

ProgressReporter *ShellInteractor::getProgressReporter()
{
    return &progress_;
}

} // namespace vclink::shell
