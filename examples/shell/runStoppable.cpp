// SPDX-License-Identifier: MIT
#include "runStoppable.hpp"

#include <string>

#include "InterruptWatch.hpp"
#include "Output.hpp"
#include "Session.hpp"
#include "failures.hpp"

namespace vclink::shell
{

ExitStatus runStoppable(Session &session, const std::function<void()> &operation)
{
    ProgressLine &line = session.progressLine();
    ShellInteractor &interactor = *session.interactor();
    const auto tell = [&line](const std::string &text)
    { line.clearFor([&text] { complain(text + " Ctrl-C ends the program at once now."); }); };
    const InterruptWatch watch(interactor.getTerminator(), interactor.activity(), tell);
    try
    {
        operation();
    }
    catch (...)
    {
        if (!watch.wasAsked())
        {
            throw;
        }
        line.clear();
        reportFailure();
        return Cancelled;
    }
    line.clear();
    if (watch.wasAsked())
    {
        remark("It was too far on to be stopped.");
    }
    return Done;
}

} // namespace vclink::shell
