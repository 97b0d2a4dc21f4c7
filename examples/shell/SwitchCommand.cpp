// SPDX-License-Identifier: MIT
#include <algorithm>
#include <optional>
#include <string>

#include <CLI/CLI.hpp>

#include "Output.hpp"
#include "ProgressLine.hpp"
#include "Session.hpp"
#include "arguments.hpp"
#include "checkedOutBranches.hpp"
#include "commands.hpp"
#include "failures.hpp"
#include "gitProgram.hpp"
#include "mergeReport.hpp"
#include "names.hpp"
#include "revisions.hpp"
#include "runStoppable.hpp"
#include "suggestions.hpp"
#include "switchReport.hpp"
#include "texts.hpp"
#include "vclink/git/LibGit2Exception.hpp"

namespace vclink::shell
{
namespace
{

/// The back end takes the files of a tag that has the branch's name, and the name of the branch.
/// The same goes for HEAD, FETCH_HEAD and the like, the stash, and an id.
/// @throws ShellFailure where that makes a difference
void refuseOtherFiles(const git::BranchManager &manager, const std::string &name)
{
    const std::optional<std::string> branch =
        findRevision(manager, "refs/heads/" + name + "^{tree}");
    const std::optional<std::string> found = findRevision(manager, name + "^{tree}");
    if (branch && found != branch)
    {
        const bool isTag = findRevision(manager, "refs/tags/" + name) &&
                           findRevision(manager, "refs/tags/" + name + "^{tree}") == found;
        if (!isTag)
        {
            throw ShellFailure(
                say("Nothing was switched: '%1%' also means something else here, and its files "
                    "would be written instead of the\nbranch's. Use \"%2%\", or rename the branch.",
                    showName(name), "git switch " + quoteForShell(name)));
        }
        throw ShellFailure(
            say("Nothing was switched: there is also a tag %1%, and its files would be written "
                "instead of the\nbranch's. Rename the tag or the branch first.",
                name));
    }
}

/// @throws ShellFailure if another working copy of the repository has the branch checked out
void refuseCheckedOut(CMAdapter &adapter, const std::string &name)
{
    const auto other = findOtherWorkingCopy(nativePath(adapter.getRootFolder()), name);
    if (other)
    {
        refuseMissingFolder(*other);
        throw ShellFailure(say("Nothing was switched: '%1%' is checked out in %2%.\nWork there, or "
                               "switch to another branch there first.",
                               showName(name), showPlace(*other)));
    }
}

/// The branch that was the current one before, as git reads it from the log of HEAD.
/// @throws ShellFailure if there was none
std::string findPrevious(CMAdapter &adapter)
{
    std::string name =
        runGit(nativePath(adapter.getRootFolder()), {"rev-parse", "--abbrev-ref", "@{-1}"})
            .value_or("");
    name.erase(std::min(name.find('\n'), name.size()));
    if (name.empty())
    {
        throw ShellFailure(say("There was no other current branch before."));
    }
    return name;
}

class SwitchCommand : public Command
{
  public:
    void declare(CLI::App &line) override
    {
        name_ =
            declareName(line, "NAME", say("A local branch, or - for the previous one"))->required();
        line.footer(say(
            "Makes the branch the current one, and writes its files. Uncommitted changes to a file "
            "are kept if\nthe file is the same in both branches; otherwise switch refuses. Ignored "
            "files that the branch\ntracks are overwritten without a copy.\n\nUntil the first "
            "file is written, Ctrl-C stops it: nothing has changed then."));
    }

    ExitStatus run(Session &session) override
    {
        const auto manager = git::BranchManager::create(session.workingCopy());
        const std::string argument = name_->results().front();
        const std::string name = argument == "-" ? findPrevious(session.adapter()) : argument;
        if (!isBranch(*manager, name))
        {
            const bool isCommit = findRevision(*manager, name + "^{commit}").has_value();
            throw ShellFailure(
                say("There is no branch '%1%'.", showName(name)) +
                (isCommit ? ' ' + say("Use \"%1%\".", "git switch --detach " + showName(name))
                          : suggestBranch(*manager, name)));
        }
        refuseOtherFiles(*manager, name);
        refuseCheckedOut(session.adapter(), name);
        const ExitStatus status = switchTo(session, *manager, name);
        if (status == Done)
        {
            remark(say("The current branch is %1%.", name));
        }
        return status;
    }

  private:
    static ExitStatus switchTo(Session &session, git::BranchManager &manager,
                               const std::string &name)
    {
        constexpr int isConflict = -13; // GIT_ECONFLICT
        try
        {
            return runStoppable(session, Stops::BeforeWriting,
                                [&manager, &name] { manager.switchBranch(name); });
        }
        catch (const git::LibGit2Exception &failure)
        {
            if (failure.getError().getCode() != isConflict)
            {
                throw;
            }
            session.progressLine().clear();
            refuseForObstacles(session.adapter(), manager, name);
            throw;
        }
    }

    const CLI::Option *name_ = nullptr;
};

} // namespace

std::unique_ptr<Command> makeSwitchCommand()
{
    return std::make_unique<SwitchCommand>();
}

} // namespace vclink::shell
