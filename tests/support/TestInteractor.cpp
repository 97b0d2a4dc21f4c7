// SPDX-License-Identifier: MIT
#include "support/TestInteractor.hpp"

#include "vclink_host/cancellation.hpp"

namespace vclink::test
{

void RecordingProgressReporter::setProgress(double fraction)
{
    fractions.push_back(fraction);
}

void RecordingProgressReporter::setProgressMessage(const ustring &message)
{
    messages.push_back(message);
}

Terminator &TestInteractor::getTerminator()
{
    return terminator;
}

ProgressReporter *TestInteractor::getProgressReporter()
{
    return &progress;
}

void TestInteractor::cancel()
{
    vclink_host::requestCancellation(terminator);
}

} // namespace vclink::test
