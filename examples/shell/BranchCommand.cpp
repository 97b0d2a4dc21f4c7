// SPDX-License-Identifier: MIT
#include <optional>
#include <string>

#include <CLI/CLI.hpp>

#include "Output.hpp"
#include "PushRefspec.hpp"
#include "Session.hpp"
#include "arguments.hpp"
#include "checkedOutBranches.hpp"
#include "commands.hpp"
#include "failures.hpp"
#include "gitProgram.hpp"
#include "names.hpp"
#include "remotes.hpp"
#include "revisions.hpp"
#include "runStoppable.hpp"
#include "suggestions.hpp"
#include "texts.hpp"
#include "unfinished.hpp"
#include "vclink/git/BranchManager.hpp"
#include "vclink/git/LibGit2Exception.hpp"

namespace vclink::shell
{
namespace
{

/// Whether a text means a commit, and is not the name of a reference to one.
bool isUnnamedCommit(const git::BranchManager &manager, const std::string &text)
{
    const std::optional<std::string> commit = findRevision(manager, text + "^{commit}");
    const auto isOf = [&](const char *folder)
    { return findRevision(manager, folder + text) == commit; };
    // No name of a reference has these.
    const bool isNamed =
        text.find_first_of("~^:") == std::string::npos &&
        (text == "HEAD" || isOf("refs/heads/") || isOf("refs/tags/") || isOf("refs/remotes/"));
    return commit && !isNamed;
}

/// @throws ShellFailure if a branch is in the way of the new one
void refuseTakenName(const git::BranchManager &manager, const std::string &name)
{
    if (isBranch(manager, name))
    {
        throw ShellFailure(
            say("There is a branch '%1%' already. Choose another name, or use the branch that is "
                "there:\n\"vclink-shell switch %2%\".",
                showName(name), quoteForShell(name)));
    }
    for (const git::BranchPointer &branch : manager.getLocalBranches())
    {
        const std::string other = shortReference(branch.getName());
        if (name.rfind(other + '/', 0) == 0 || other.rfind(name + '/', 0) == 0)
        {
            throw ShellFailure(say("Git can't have the branches '%1%' and '%2%' at a time, as one "
                                   "is like a folder of the other.\nChoose another name.",
                                   showName(name), showName(other)));
        }
    }
}

/// @throws ShellFailure if it failed because of the name of the new branch
void explainName(const std::string &name, const git::LibGit2Exception &failure)
{
    constexpr int isInvalid = -12; // GIT_EINVALIDSPEC
    if (failure.getError().getCode() == isInvalid || name == "HEAD" || name.front() == '-')
    {
        throw ShellFailure(say("'%1%' can't be the name of a branch. Blanks, control characters, "
                               "\"..\", \"@{\", and any of ~^:?*[\\ can't\nbe in it; \"git help "
                               "check-ref-format\" has all rules.",
                               showName(name)));
    }
}

/// Whether the current branch has all commits of another one, as far as git can tell.
bool isMerged(CMAdapter &adapter, const std::string &tip)
{
    return runGit(nativePath(adapter.getRootFolder()), {"merge-base", "--is-ancestor", tip, "HEAD"})
        .has_value();
}

class BranchCommand : public Command
{
  public:
    void declare(CLI::App &line) override
    {
        name_ = declareName(line, "NAME", say("The branch"))->required();
        start_ = declareName(line, "START",
                             say("Where the new branch begins: a branch, or a tag that is not "
                                 "annotated;\nwithout it, HEAD"));
        line.add_flag("-d", deletes_, say("Delete the branch, merged or not"));
        line.callback([this] { checkStart(); });
        line.footer(say("Makes or deletes a branch. The current branch stays the same, and can't "
                        "be deleted."));
    }

    ExitStatus run(Session &session) override
    {
        const auto manager = git::BranchManager::create(session.adapter());
        const std::string name = name_->results().front();
        // The way back from a deletion.
        const std::string tip = findRevision(*manager, "refs/heads/" + name).value_or("");
        if (deletes_)
        {
            refuseToDelete(session.adapter(), *manager, name);
            refuseUnreadable(name, tip);
        }
        const bool mayLoseCommits = deletes_ && !isMerged(session.adapter(), tip);
        try
        {
            const ExitStatus status =
                runStoppable(session, Stops::Never, [&] { act(*manager, name); });
            if (status == Done)
            {
                (mayLoseCommits ? inform : remark)(
                    deletes_ ? say("Deleted the branch %1%, which was at %2%.", name, tip)
                             : say("Made the branch %1%.", name));
            }
            return status;
        }
        catch (const git::LibGit2Exception &failure)
        {
            if (deletes_)
            {
                throw;
            }
            refuseUnknownStart(*manager);
            refuseTakenName(*manager, name);
            if (!isUnnamedCommit(*manager, start()))
            {
                explainName(name, failure);
                throw;
            }
            throw ShellFailure(
                say("No branch was made: START must be the name of a branch, or of a tag that is "
                    "not annotated. For any\nother commit, use \"git branch %1% %2%\".",
                    quoteForShell(name), quoteForShell(start())));
        }
    }

  private:
    static void refuseToDelete(CMAdapter &adapter, const git::BranchManager &manager,
                               const std::string &name)
    {
        if (!isBranch(manager, name))
        {
            throw ShellFailure(say("There is no branch '%1%'.", showName(name)) +
                               suggestBranch(manager, name));
        }
        if (findCurrentBranch(manager) == name)
        {
            throw ShellFailure(say("Nothing was deleted: '%1%' is the current branch. Switch to "
                                   "another one first.",
                                   showName(name)));
        }
        refuseNeeded(adapter, name);
    }

    /// @param tip of the branch, empty if it can't be read
    /// @throws ShellFailure in that case: no way back could be named
    static void refuseUnreadable(const std::string &name, const std::string &tip)
    {
        if (tip.empty())
        {
            throw ShellFailure(say("Nothing was deleted: the commit of '%1%' can't be read, so "
                                   "there would be no way back. To\ndelete the branch "
                                   "nevertheless, use \"git branch -D %2%\".",
                                   showName(name), quoteForShell(name)));
        }
    }

    /// @throws ShellFailure if a working copy has the branch checked out, or returns to it
    static void refuseNeeded(CMAdapter &adapter, const std::string &name)
    {
        for (const CheckedOutBranch &branch :
             findCheckedOutBranches(nativePath(adapter.getRootFolder())))
        {
            const bool isMeant = branch.name == name;
            const std::string unfinished =
                isMeant && branch.isOwn ? describeUnfinished(adapter) : std::string();
            if (!unfinished.empty())
            {
                throw ShellFailure(say("Nothing was deleted. %1%", unfinished));
            }
            if (isMeant && !branch.isOwn)
            {
                refuseMissingFolder(branch);
                throw ShellFailure(
                    branch.isMoved
                        ? say("Nothing was deleted: a rebase in %2% moves '%1%' when it ends.\n"
                              "End the rebase first.",
                              showName(name), showPlace(branch))
                        : say("Nothing was deleted: '%1%' is checked out in %2%.\nSwitch to "
                              "another branch there first.",
                              showName(name), showPlace(branch)));
            }
        }
    }

    void refuseUnknownStart(const git::BranchManager &manager) const
    {
        if (findRevision(manager, start() + "^{commit}"))
        {
            return;
        }
        if (isUnreadable(manager, start()))
        {
            throw ShellFailure(
                say("No branch was made: the commit of '%1%' can't be read.", showName(start())));
        }
        if (start() == "HEAD")
        {
            throw ShellFailure(say("There is no commit yet that a branch could begin at."));
        }
        throw ShellFailure(say("There is no branch and no commit '%1%'.", showName(start())) +
                           suggestBranch(manager, start()));
    }

    void act(git::BranchManager &manager, const std::string &name) const
    {
        if (deletes_)
        {
            manager.deleteBranch(name);
        }
        else
        {
            manager.createBranch(git::BranchParameters(name, start()));
        }
    }

    std::string start() const
    {
        return start_->empty() ? "HEAD" : start_->results().front();
    }

    void checkStart() const
    {
        if (deletes_ && !start_->empty())
        {
            throw CLI::ValidationError("START", say("is not allowed with -d"));
        }
    }

    const CLI::Option *name_ = nullptr;
    const CLI::Option *start_ = nullptr;
    bool deletes_ = false;
};

} // namespace

std::unique_ptr<Command> makeBranchCommand()
{
    return std::make_unique<BranchCommand>();
}

} // namespace vclink::shell
