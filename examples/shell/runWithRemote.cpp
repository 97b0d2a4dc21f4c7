// SPDX-License-Identifier: MIT
#include "runWithRemote.hpp"

#include "BusyLine.hpp"
#include "Output.hpp"
#include "ProgressLine.hpp"
#include "Session.hpp"
#include "access.hpp"
#include "failures.hpp"
#include "fl/i18n/convert.hpp"
#include "vclink/git/LibGit2Exception.hpp"
#include "wayOut.hpp"

namespace vclink::shell
{
namespace
{

/// The first line is the program's own. What follows may be the server's.
void tellFailure(const git::LibGit2Exception &failure)
{
    const std::string text = fl::i18n::ustring_to_utf8(failure.GetUnicodeMessageTxt());
    const std::size_t end = text.find('\n');
    complain(text.substr(0, end));
    if (end != std::string::npos)
    {
        relay(text.substr(end + 1));
    }
}

} // namespace

ExitStatus runWithRemote(Session &session, const std::string &text, RemoteNotes &notes,
                         const std::function<ExitStatus()> &operation)
{
    ProgressLine &line = session.progressLine();
    const ShellInteractor &interactor = *session.interactor();
    try
    {
        BusyLine busy(line, text, [&interactor] { return interactor.isWriting(); });
        notes.hear = [&](const std::string &words, bool isProgress)
        {
            if (isProgress)
            {
                busy.setDetail(words);
            }
            else if (errorsAreOnTerminal())
            {
                line.clearFor([&words] { relay(words); });
            }
        };
        const RemoteLog log(notes);
        return operation();
    }
    catch (const git::LibGit2Exception &failure)
    {
        line.clear();
        tellServersWords(notes);
        tellFailure(failure);
        const std::string explanation = explainRefusedAccess(failure.getError(), notes);
        if (!explanation.empty())
        {
            complain(explanation);
        }
        if (!tellRemoteFormat(session, failure.getError()))
        {
            tellWayOut(session);
        }
        return Failed;
    }
}

ExitStatus runStoppableWithRemote(Session &session, Stops stops, const std::string &text,
                                  RemoteNotes &notes, const std::function<void()> &operation)
{
    return runWithRemote(session, text, notes,
                         [&] { return runStoppable(session, stops, operation); });
}

void tellServersWords(const RemoteNotes &notes)
{
    if (!errorsAreOnTerminal())
    {
        for (const std::string &words : notes.words)
        {
            relay(words);
        }
    }
}

} // namespace vclink::shell
