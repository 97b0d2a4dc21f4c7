// SPDX-License-Identifier: MIT
#include <algorithm>
#include <filesystem>
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
#include "gitProgram.hpp"
#include "names.hpp"
#include "refspecPatterns.hpp"
#include "remotes.hpp"
#include "revisions.hpp"
#include "runWithRemote.hpp"
#include "texts.hpp"
#include "vclink/git/LibGit2Exception.hpp"

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
                         say("What to push: main, or mine:main to push mine to the remote's "
                             "main.\n:main deletes the remote's main; +main overwrites it, and can "
                             "lose\ncommits there. Without any, the current branch"));
        line.footer(say("Sends commits to the remote, and moves its branches or tags. If the "
                        "server rejects some, they are\nlisted with its reason, and the status is "
                        "1.\n\nNever prompts (see clone)."));
    }

    ExitStatus run(Session &session) override
    {
        const std::string name = chooseRemote(session, *remote_, Direction::There);
        const auto manager = git::BranchManager::create(session.adapter());
        const std::string branch = findCurrentBranch(*manager).value_or("");
        const auto configured = refspecs_->empty()
                                    ? configuredRefspecs(session, name, Direction::There)
                                    : std::vector<std::string>();
        const auto chosen = configured.empty() ? chooseRefspecs(branch) : configured;
        const auto remote = openRemote(session, name, Direction::There);
        const bool isElsewhere = pushesElsewhere(session, name);
        const auto askHeads = [&]
        {
            if (isElsewhere)
            {
                throw ShellFailure(say("Nothing was pushed: %1% has another address for pushes, "
                                       "which cannot be listed. Use full names, e.g. "
                                       "refs/heads/NAME:refs/heads/NAME.",
                                       name));
            }
            return remote->getRemoteHeads();
        };
        std::vector<PushRefspec> refspecs;
        RemoteNotes notes;
        const ExitStatus status = runStoppableWithRemote(
            session, Stops::WhenServerTalks, say("Pushing to %1%:", name), notes,
            [&]
            {
                const auto texts = configured.empty()
                                       ? chosen
                                       : expandPush(configured, listReferences(session), askHeads);
                for (const std::string &text : texts)
                {
                    refspecs.push_back(readPushRefspec(*manager, text, branch, askHeads));
                }
                if (isElsewhere)
                {
                    remote->push(readRefspecs(textsOf(refspecs)));
                    return;
                }
                dropWhatIsThere(*manager, *remote, name, refspecs);
                if (!refspecs.empty())
                {
                    push(session, *remote, name, refspecs);
                }
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
            throw ShellFailure(noCurrentBranch());
        }
        return {"refs/heads/" + branch};
    }

    static std::vector<std::string> listReferences(Session &session)
    {
        std::string text = runGit(nativePath(session.adapter().getRootFolder()),
                                  {"for-each-ref", "--format=%(refname)"})
                               .value_or("");
        std::replace(text.begin(), text.end(), '\n', '\0');
        return splitAtNul(text);
    }

    /// Removes what the remote has already. Asks it only if it had the same when it was last seen.
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

    static std::vector<std::string> textsOf(const std::vector<PushRefspec> &refspecs)
    {
        std::vector<std::string> texts;
        texts.reserve(refspecs.size());
        for (const PushRefspec &refspec : refspecs)
        {
            texts.push_back(refspec.text());
        }
        return texts;
    }

    static void push(Session &session, git::GitRemote &remote, const std::string &name,
                     const std::vector<PushRefspec> &refspecs)
    {
        try
        {
            remote.push(readRefspecs(textsOf(refspecs)));
        }
        catch (const git::LibGit2Exception &failure)
        {
            constexpr int isNoFastForward = -11; // GIT_ENONFASTFORWARD
            if (failure.getError().getCode() == isNoFastForward)
            {
                explainRefusal(session, remote, name, refspecs);
            }
            throw;
        }
    }

    /// @throws ShellFailure that names what would lose commits, or would be another tag
    static void explainRefusal(Session &session, const git::GitRemote &remote,
                               const std::string &name, const std::vector<PushRefspec> &refspecs)
    {
        const std::filesystem::path root = nativePath(session.adapter().getRootFolder());
        const std::vector<git::GitRemoteHead> heads = remote.getRemoteHeads();
        for (const PushRefspec &refspec : refspecs)
        {
            const auto there = std::find_if(heads.begin(), heads.end(),
                                            [&refspec](const git::GitRemoteHead &head)
                                            { return head.name == refspec.target; });
            if (there == heads.end() || refspec.source.empty() || refspec.mayLoseCommits)
            {
                continue;
            }
            const std::string target = shortReference(refspec.target);
            const std::string names = refspec.source == refspec.target
                                          ? target
                                          : shortReference(refspec.source) + ':' + target;
            const std::string forced =
                "vclink-shell push " + quoteForShell(name) + ' ' + quoteForShell('+' + names);
            if (refspec.target.rfind("refs/tags/", 0) == 0)
            {
                throw ShellFailure(say("Nothing was pushed: the tag '%1%' is another one at %2%. "
                                       "To replace it there:\n%3%",
                                       showName(target), name, forced));
            }
            if (!runGit(root,
                        {"merge-base", "--is-ancestor", hexadecimal(there->oid), refspec.source}))
            {
                throw ShellFailure(
                    say("Nothing was pushed: the branch '%1%' at %2% has commits that yours does "
                        "not have.\nDownload them with \"vclink-shell fetch\", merge them, and "
                        "push again. To discard them there instead:\n%3%",
                        showName(target), name, forced));
            }
        }
    }

    /// The back end counts a push as done whatever the server made of it.
    static ExitStatus tell(const RemoteNotes &notes, const std::vector<PushRefspec> &refspecs,
                           const std::string &remote)
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
            remark(say("Everything is up to date at %1%.", remote));
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
