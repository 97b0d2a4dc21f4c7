// SPDX-License-Identifier: MIT
#include <string>

#include <CLI/CLI.hpp>

#include "Output.hpp"
#include "Session.hpp"
#include "arguments.hpp"
#include "commands.hpp"
#include "remotes.hpp"
#include "runWithRemote.hpp"

namespace vclink::shell
{
namespace
{

class FetchCommand : public Command
{
  public:
    void declare(CLI::App &line) override
    {
        remote_ = declareRemote(line);
        refspecs_ = declareNames(line, "REFSPEC",
                                 "What to fetch, and where to, e.g. "
                                 "refs/heads/a:refs/remotes/origin/a;\nwithout any, what the "
                                 "remote's configuration says");
        line.footer(
            "Brings the remote's branches and their tags up to date here, e.g. origin/main. The "
            "working copy\nstays as it is: see merge for the next step. A branch that is gone at "
            "the remote stays here. What\nis not found there is passed over.\n\n"
            "Nobody is asked anything, see clone. Ctrl-C stops it while it is sent, and the "
            "branches stay as they\nwere; where the server is silent, as with clone.");
    }

    ExitStatus run(Session &session) override
    {
        const std::string name = remote_->results().front();
        const auto remote = openRemote(session, *remote_);
        RemoteNotes notes;
        const ExitStatus status = runStoppableWithRemote(
            session, notes, [&] { remote->fetch(readRefspecs(*refspecs_)); });
        if (status == Done)
        {
            remark(notes.updated == 0 ? "There was nothing new at " + name + '.'
                                      : "Fetched from " + name + ": " + count(notes.updated) + '.');
        }
        return status;
    }

  private:
    static std::string count(unsigned references)
    {
        return std::to_string(references) +
               (references == 1 ? " reference changed" : " references changed");
    }

    const CLI::Option *remote_ = nullptr;
    const CLI::Option *refspecs_ = nullptr;
};

} // namespace

std::unique_ptr<Command> makeFetchCommand()
{
    return std::make_unique<FetchCommand>();
}

} // namespace vclink::shell
