// SPDX-License-Identifier: MIT
#include "ShellInteractor.hpp"

namespace vclink::shell
{

ShellInteractor::ShellInteractor(ProgressLine &line) : progress_(line, activity_)
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

Activity &ShellInteractor::activity() noexcept
{
    return activity_;
}

bool ShellInteractor::isWriting() const noexcept
{
    return progress_.hasBegun();
}

} // namespace vclink::shell
