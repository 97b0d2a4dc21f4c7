// SPDX-License-Identifier: MIT
#include "runWithRemote.hpp"

#include <string>

#include "ProgressLine.hpp"
#include "Session.hpp"
#include "access.hpp"
#include "failures.hpp"
#include "runStoppable.hpp"
#include "vclink/git/LibGit2Exception.hpp"

namespace vclink::shell
{

ExitStatus runWithRemote(Session &session, RemoteNotes &notes,
                         const std::function<ExitStatus()> &operation)
{
    try
    {
        const RemoteLog log(notes);
        return operation();
    }
    catch (const git::LibGit2Exception &failure)
    {
        session.progressLine().clear();
        reportFailure();
        const std::string explanation =
            notes.credentials ? explainRefusedAccess(failure.getError(), *notes.credentials) : "";
        if (!explanation.empty())
        {
            complain(explanation);
        }
        return Failed;
    }
}

ExitStatus runStoppableWithRemote(Session &session, RemoteNotes &notes,
                                  const std::function<void()> &operation)
{
    return runWithRemote(session, notes, [&] { return runStoppable(session, operation); });
}

} // namespace vclink::shell
