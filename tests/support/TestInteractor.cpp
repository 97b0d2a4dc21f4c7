// SPDX-License-Identifier: MIT
#include "support/TestInteractor.hpp"

#include <utility>

#include "vclink_host/cancellation.hpp"

namespace vclink::test
{

void RecordingProgressReporter::setProgress(double fraction)
{
    fractions.push_back(fraction);
    remember(fraction);
}

void RecordingProgressReporter::setProgressMessage(const ustring &message)
{
    messages.push_back(message);
    remember(message);
}

void RecordingProgressReporter::remember(ProgressCall call)
{
    calls.push_back(std::move(call));
    if (onCall)
    {
        onCall(calls.size());
    }
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
