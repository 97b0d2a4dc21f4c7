// SPDX-License-Identifier: MIT
#include <algorithm>
#include <memory>
#include <set>
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
#include "revisions.hpp"
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
                dropWhatIsThere(*manager, *remote, name, refspecs);
                if (isConfigured || !refspecs.empty())
                {
                    push(*remote, refspecs);
                }
            });
        return status == Done ? tell(notes, refspecs, name, isConfigured) : status;
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

    /// What the remote had when it was heard of last may be there still: only then it is asked.
    static void dropWhatIsThere(const git::BranchManager &manager, const git::GitRemote &remote,
                                const std::string &name, std::vector<PushRefspec> &refspecs)
    {
        const auto mayBeThere = [&](const PushRefspec &refspec)
        {
            const std::string tracking =
                "refs/remotes/" + name + '/' + shortReference(refspec.target);
            const auto id = findRevision(manager, tracking);
            return !refspec.source.empty() && id && findRevision(manager, refspec.source) == id;
        };
        if (std::none_of(refspecs.begin(), refspecs.end(), mayBeThere))
        {
            return;
        }
        const std::vector<git::GitRemoteHead> heads = remote.getRemoteHeads();
        const auto isThere = [&](const PushRefspec &refspec)
        {
            return mayBeThere(refspec) &&
                   std::any_of(heads.begin(), heads.end(),
                               [&](const git::GitRemoteHead &head)
                               {
                                   return head.name == refspec.target &&
                                          hexadecimal(head.oid) ==
                                              findRevision(manager, refspec.source);
                               });
        };
        refspecs.erase(std::remove_if(refspecs.begin(), refspecs.end(), isThere), refspecs.end());
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
                           const std::string &remote, bool isConfigured)
    {
        std::string rejected;
        std::set<std::string> names;
        for (const PushedReference &reference : notes.pushed)
        {
            if (!reference.rejection.empty())
            {
                names.insert(reference.name);
                rejected += "\n  " + reference.name + ": " +
                            makePrintableLine(fl::i18n::utf8_to_ustring(reference.rejection));
            }
        }
        for (const PushRefspec &refspec : refspecs)
        {
            if (names.count(refspec.target) == 0)
            {
                (rejected.empty() ? remark : inform)(refspec.describe(remote));
            }
        }
        if (!rejected.empty())
        {
            tellServersWords(notes);
            complain(say("%1% rejected:%2%", remote, rejected));
            return Failed;
        }
        if (refspecs.empty())
        {
            remark(isConfigured ? say("Pushed to %1%, as remote.%1%.push says.", remote)
                                : say("Everything is up to date at %1%.", remote));
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
