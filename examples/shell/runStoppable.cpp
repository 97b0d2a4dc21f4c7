// SPDX-License-Identifier: MIT
#include "runStoppable.hpp"

#include <csignal>
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
    InterruptWatch watch(interactor.getTerminator(), interactor.activity(), tell);
    const auto end = [&]
    {
        watch.end();
        if (watch.askedBy() != 0 && watch.askedBy() != SIGINT)
        {
            session.endBySignal(watch.askedBy());
        }
        line.clear();
    };
    try
    {
        operation();
    }
    catch (...)
    {
        end();
        if (watch.askedBy() == 0)
        {
            throw;
        }
        reportFailure();
        return endedBy(watch.askedBy());
    }
    end();
    if (watch.askedBy() != 0)
    {
        remark("It was too far on to be stopped.");
    }
    return Done;
}

} // namespace vclink::shell
