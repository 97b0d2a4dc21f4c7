// SPDX-License-Identifier: MIT
#include <string>

#include <CLI/CLI.hpp>

#include "Output.hpp"
#include "Session.hpp"
#include "arguments.hpp"
#include "commands.hpp"
#include "failures.hpp"
#include "remotes.hpp"
#include "runWithRemote.hpp"

namespace vclink::shell
{
namespace
{

class PushCommand : public Command
{
  public:
    void declare(CLI::App &line) override
    {
        remote_ = declareRemote(line);
        refspecs_ = declareNames(line, "REFSPEC",
                                 "What to push, and where to, by full names: refs/heads/main, or\n"
                                 "refs/heads/mine:refs/heads/main; with nothing before the colon "
                                 "it is\ndeleted there, with a plus in front it may lose commits "
                                 "there");
        line.footer("Sends commits to the remote, and moves its branches or tags. Without any "
                    "REFSPEC, what the setting\n"
                    "remote.REMOTE.push says. A server may reject some and take others: those that "
                    "it rejects are named\n"
                    "with its reason, and the status is 1.\n\n"
                    "Nobody is asked anything, see clone. Ctrl-C can stop it only as long as the "
                    "server sends something\n"
                    "to be read; where it is silent, as with clone.");
    }

    ExitStatus run(Session &session) override
    {
        const std::string name = remote_->results().front();
        const auto remote = openRemote(session, *remote_);
        RemoteNotes notes;
        const ExitStatus status =
            runStoppableWithRemote(session, notes, [&] { remote->push(readRefspecs(*refspecs_)); });
        return status == Done ? tell(notes, name) : status;
    }

  private:
    /// The back end counts a push as done whatever the server made of it.
    ExitStatus tell(const RemoteNotes &notes, const std::string &remote) const
    {
        std::string rejected;
        for (const PushedReference &reference : notes.pushed)
        {
            if (!reference.rejection.empty())
            {
                rejected += "\n  " + reference.name + ": " + reference.rejection;
            }
        }
        if (!rejected.empty())
        {
            complain(remote + " rejected:" + rejected);
            return Failed;
        }
        if (notes.pushed.empty() && refspecs_->empty())
        {
            complain("Nothing was pushed: no REFSPEC was given, and remote." + remote +
                     ".push is not set.");
            return Failed;
        }
        remark("Pushed to " + remote + '.');
        return Done;
    }

    const CLI::Option *remote_ = nullptr;
    const CLI::Option *refspecs_ = nullptr;
};

} // namespace

std::unique_ptr<Command> makePushCommand()
{
    return std::make_unique<PushCommand>();
}

} // namespace vclink::shell
