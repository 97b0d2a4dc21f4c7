// SPDX-License-Identifier: MIT
#include <algorithm>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "Output.hpp"
#include "PushRefspec.hpp"
#include "Session.hpp"
#include "arguments.hpp"
#include "checkedOutBranches.hpp"
#include "commands.hpp"
#include "failures.hpp"
#include "names.hpp"
#include "refspecPatterns.hpp"
#include "remotes.hpp"
#include "revisions.hpp"
#include "runWithRemote.hpp"
#include "suggestions.hpp"
#include "texts.hpp"

namespace vclink::shell
{
namespace
{

/// Whether the source of a refspec means a reference of the remote.
bool isMeant(const git::GitRemoteHead &head, const std::string &source)
{
    return head.name == source || head.name == "refs/" + source ||
           head.name == "refs/tags/" + source || head.name == "refs/heads/" + source ||
           hexadecimal(head.oid) == source;
}

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
        const auto remote = openRemote(session, name, Direction::Here);
        const auto configured = configuredRefspecs(session, name, Direction::Here);
        RemoteNotes notes;
        const ExitStatus status = runStoppableWithRemote(
            session, Stops::BeforeWriting, say("Fetching from %1%:", name), notes,
            [&]
            {
                const std::vector<std::string> refspecs = refspecs_->results();
                refuseMissing(*remote, name, refspecs);
                refuseCheckedOut(session, *remote, name, refspecs.empty() ? configured : refspecs);
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
        known.reserve(heads.size());
        for (const git::GitRemoteHead &head : heads)
        {
            known.push_back(shortReference(head.name));
        }
        for (const std::string &refspec : refspecs)
        {
            const std::string text = refspec.substr(refspec.find('+') == 0 ? 1 : 0);
            const std::string source = text.substr(0, text.find(':'));
            const bool isReadable = std::count(text.begin(), text.end(), ':') < 2;
            if (isReadable && !source.empty() && source.find('*') == std::string::npos &&
                std::none_of(heads.begin(), heads.end(),
                             [&source](const git::GitRemoteHead &head)
                             { return isMeant(head, source); }))
            {
                throw ShellFailure(say("Nothing was fetched: %1% has no reference '%2%'.", name,
                                       showName(source)) +
                                   suggest(source, known));
            }
        }
    }

    /// The back end moves them, and leaves the index and the files as they are: the next commit
    /// would undo what the branch got.
    /// @throws ShellFailure if a checked-out branch would be moved
    static void refuseCheckedOut(Session &session, const git::GitRemote &remote,
                                 const std::string &name, const std::vector<std::string> &refspecs)
    {
        const auto manager = git::BranchManager::create(session.adapter());
        for (const CheckedOutBranch &branch :
             findCheckedOutBranches(nativePath(session.adapter().getRootFolder())))
        {
            const std::string full = "refs/heads/" + branch.name;
            const auto source = findSource(refspecs, full);
            if (!source)
            {
                continue;
            }
            const std::vector<git::GitRemoteHead> heads = remote.getRemoteHeads();
            if (std::any_of(heads.begin(), heads.end(),
                            [&](const git::GitRemoteHead &head) {
                                return isMeant(head, *source) &&
                                       hexadecimal(head.oid) != findRevision(*manager, full);
                            }))
            {
                refuseMissingFolder(branch);
                throw ShellFailure(
                    branch.isMoved
                        ? say("Nothing was fetched: that would move the branch '%1%', which a "
                              "rebase in %2% moves when it ends.\nFetch into refs/remotes/%3%/ "
                              "instead, or end the rebase first.",
                              showName(branch.name), showPlace(branch), name)
                        : say("Nothing was fetched: that would move the branch '%1%', which is "
                              "checked out in %2%.\nFetch into refs/remotes/%3%/ instead, and "
                              "merge.",
                              showName(branch.name), showPlace(branch), name));
            }
        }
    }

    /// What is fetched into a branch; nothing if nothing is.
    static std::optional<std::string> findSource(const std::vector<std::string> &refspecs,
                                                 const std::string &branch)
    {
        for (const std::string &refspec : refspecs)
        {
            const std::string text = refspec.substr(refspec.find('+') == 0 ? 1 : 0);
            const std::size_t colon = text.find(':');
            if (colon == std::string::npos || colon + 1 == text.size())
            {
                continue;
            }
            const std::string target = text.substr(colon + 1);
            // As libgit2 completes a short name.
            const std::string full = (target.find("refs/") == 0 ? "" : "refs/heads/") + target;
            std::optional<std::string> source = mapReference(full, text.substr(0, colon), branch);
            if (source)
            {
                return source;
            }
        }
        return std::nullopt;
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
