// SPDX-License-Identifier: MIT
#include <memory>
#include <string>

#include "Output.hpp"
#include "Session.hpp"
#include "arguments.hpp"
#include "commands.hpp"
#include "remotes.hpp"
#include "runWithRemote.hpp"
#include "texts.hpp"

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
                                 say("What to fetch, and where to, e.g. "
                                     "refs/heads/a:refs/remotes/origin/a;\nwithout any, what the "
                                     "remote's configuration says"));
        line.footer(say("Updates the remote's branches and their tags here, e.g. origin/main. The "
                        "working copy stays as it\nis: see merge for the next step. A branch that "
                        "was deleted at the remote stays here.\n\n"
                        "Never prompts (see clone)."));
    }

    ExitStatus run(Session &session) override
    {
        const std::string name = chooseRemote(session, *remote_, Direction::Here);
        const auto remote = openRemote(session, name);
        RemoteNotes notes;
        const ExitStatus status = runStoppableWithRemote(
            session, Stops::BeforeWriting, say("Fetching from %1%:", name), notes,
            [&] { remote->fetch(readRefspecs(refspecs_->results())); });
        if (status == Done)
        {
            remark(notes.updated == 0 ? say("There was nothing new at %1%.", name)
                                      : say("Fetched from %1%: %2%.", name,
                                            sayCount(notes.updated, "%1% reference changed",
                                                     "%1% references changed")));
        }
        return status;
    }

  private:
    const CLI::Option *remote_ = nullptr;
    const CLI::Option *refspecs_ = nullptr;
};

} // namespace

std::unique_ptr<Command> makeFetchCommand()
{
    return std::make_unique<FetchCommand>();
}

} // namespace vclink::shell
