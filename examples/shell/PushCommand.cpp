// SPDX-License-Identifier: MIT
#include <memory>
#include <string>
#include <vector>

#include "Output.hpp"
#include "PushRefspec.hpp"
#include "Session.hpp"
#include "arguments.hpp"
#include "commands.hpp"
#include "failures.hpp"
#include "fl/i18n/convert.hpp"
#include "names.hpp"
#include "remotes.hpp"
#include "runWithRemote.hpp"
#include "texts.hpp"

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
        refspecs_ =
            declareNames(line, "REFSPEC",
                         say("What to push, and where to: main, or mine:main; with nothing before\n"
                             "the colon it is deleted there, with a plus in front it may lose\n"
                             "commits there; without any, the current branch"));
        line.footer(say("Sends commits to the remote, and moves its branches or tags. What the "
                        "server rejects is named with\nits reason, and the status is 1.\n\n"
                        "Never prompts (see clone)."));
    }

    ExitStatus run(Session &session) override
    {
        const std::string name = chooseRemote(session, *remote_, Direction::There);
        const bool isConfigured = refspecs_->empty() && isPushConfigured(session, name);
        const auto manager = git::BranchManager::create(session.adapter());
        const std::string branch = findCurrentBranch(*manager).value_or("");
        const auto texts = isConfigured ? std::vector<std::string>() : chooseRefspecs(branch);
        const auto remote = openRemote(session, name);
        std::vector<PushRefspec> refspecs;
        RemoteNotes notes;
        const ExitStatus status = runStoppableWithRemote(
            session, Stops::WhenServerTalks, say("Pushing to %1%:", name), notes,
            [&]
            {
                for (const std::string &text : texts)
                {
                    refspecs.push_back(readPushRefspec(
                        *manager, text, branch, [&remote] { return remote->getRemoteHeads(); }));
                }
                push(*remote, refspecs);
            });
        return status == Done ? tell(notes, refspecs, name) : status;
    }

  private:
    std::vector<std::string> chooseRefspecs(const std::string &branch) const
    {
        if (!refspecs_->empty())
        {
            return refspecs_->results();
        }
        if (branch.empty())
        {
            throw ShellFailure(
                say("Nothing was pushed: there is no current branch. Name what to push."));
        }
        return {"refs/heads/" + branch};
    }

    static void push(git::GitRemote &remote, const std::vector<PushRefspec> &refspecs)
    {
        std::vector<std::string> texts;
        for (const PushRefspec &refspec : refspecs)
        {
            texts.push_back(refspec.text());
        }
        remote.push(readRefspecs(texts));
    }

    /// The back end counts a push as done whatever the server made of it.
    static ExitStatus tell(const RemoteNotes &notes, const std::vector<PushRefspec> &refspecs,
                           const std::string &remote)
    {
        std::string rejected;
        for (const PushedReference &reference : notes.pushed)
        {
            if (!reference.rejection.empty())
            {
                rejected += "\n  " + reference.name + ": " +
                            makePrintableLine(fl::i18n::utf8_to_ustring(reference.rejection));
            }
        }
        if (!rejected.empty())
        {
            tellServersWords(notes);
            complain(say("%1% rejected:%2%", remote, rejected));
            return Failed;
        }
        for (const PushRefspec &refspec : refspecs)
        {
            remark(refspec.describe(remote));
        }
        if (refspecs.empty())
        {
            remark(say("Pushed to %1%, as remote.%1%.push says.", remote));
        }
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
