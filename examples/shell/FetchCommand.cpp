// SPDX-License-Identifier: MIT
#include <algorithm>
#include <memory>
#include <string>

#include "Output.hpp"
#include "PushRefspec.hpp"
#include "Session.hpp"
#include "arguments.hpp"
#include "commands.hpp"
#include "failures.hpp"
#include "names.hpp"
#include "remotes.hpp"
#include "runWithRemote.hpp"
#include "suggestions.hpp"
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
        line.footer(say("Downloads the remote's branches, e.g. as origin/main, and their tags. The "
                        "working copy stays as it\nis: see merge for the next step. A branch that "
                        "was deleted at the remote stays here.\n\nNever prompts (see clone)."));
    }

    ExitStatus run(Session &session) override
    {
        const std::string name = chooseRemote(session, *remote_, Direction::Here);
        const auto remote = openRemote(session, name);
        RemoteNotes notes;
        const ExitStatus status = runStoppableWithRemote(
            session, Stops::BeforeWriting, say("Fetching from %1%:", name), notes,
            [&]
            {
                const std::vector<std::string> refspecs = refspecs_->results();
                refuseMissing(*remote, name, refspecs);
                remote->fetch(readRefspecs(refspecs));
            });
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
    /// The back end skips them.
    /// @throws ShellFailure if the remote does not have what a refspec begins with
    static void refuseMissing(const git::GitRemote &remote, const std::string &name,
                              const std::vector<std::string> &refspecs)
    {
        if (refspecs.empty())
        {
            return;
        }
        const std::vector<git::GitRemoteHead> heads = remote.getRemoteHeads();
        std::vector<std::string> known;
        for (const git::GitRemoteHead &head : heads)
        {
            known.push_back(shortReference(head.name));
        }
        for (const std::string &refspec : refspecs)
        {
            const std::string text = refspec.substr(refspec.find('+') == 0 ? 1 : 0);
            const std::string source = text.substr(0, text.find(':'));
            const auto isMeant = [&source](const git::GitRemoteHead &head)
            {
                return head.name == source || head.name == "refs/" + source ||
                       head.name == "refs/tags/" + source || head.name == "refs/heads/" + source ||
                       hexadecimal(head.oid) == source;
            };
            const bool isReadable = std::count(text.begin(), text.end(), ':') < 2;
            if (isReadable && !source.empty() && source.find('*') == std::string::npos &&
                std::none_of(heads.begin(), heads.end(), isMeant))
            {
                throw ShellFailure(say("Nothing was fetched: %1% has no reference '%2%'.", name,
                                       showName(source)) +
                                   suggest(source, known));
            }
        }
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
