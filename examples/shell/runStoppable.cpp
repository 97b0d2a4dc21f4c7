// SPDX-License-Identifier: MIT
#include "runStoppable.hpp"

#include <atomic>
#include <csignal>
#include <string>

#include "InterruptWatch.hpp"
#include "Output.hpp"
#include "Session.hpp"
#include "failures.hpp"
#include "texts.hpp"

namespace vclink::shell
{
namespace
{

std::string describeRequest(Stops stops, bool isPromised)
{
    if (stops == Stops::Never)
    {
        return say("This can't be cancelled. It goes on to its end.");
    }
    if (!isPromised)
    {
        return say("Too late to cancel: files are being written.");
    }
    return stops == Stops::WhenServerTalks ? say("Cancelling, as soon as the server answers.")
                                           : say("Cancelling.");
}

} // namespace

ExitStatus runStoppable(Session &session, Stops stops, const std::function<void()> &operation)
{
    ProgressLine &line = session.progressLine();
    ShellInteractor &interactor = *session.interactor();
    std::atomic<bool> isPromised{false};
    const auto tellAsked = [&]
    {
        isPromised.store(stops != Stops::Never && !interactor.isWriting());
        line.clearFor([&] { remark(describeRequest(stops, isPromised.load())); });
    };
    const auto tellGivenUp = [&line](const std::string &text)
    {
        line.clearFor([&text]
                      { complain(text + ' ' + say("The next Ctrl-C ends the program at once.")); });
    };
    InterruptWatch watch(interactor.getTerminator(), interactor.activity(), tellGivenUp, tellAsked);
    const auto end = [&]
    {
        watch.end();
        if (watch.askedBy() != 0 && watch.askedBy() != SIGINT)
        {
            session.endBySignal(watch.askedBy());
        }
        line.end();
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
    if (isPromised.load())
    {
        remark(say("It was done before it could be cancelled."));
    }
    return Done;
}

} // namespace vclink::shell
