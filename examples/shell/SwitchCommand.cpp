// SPDX-License-Identifier: MIT
#include <optional>
#include <string>

#include <CLI/CLI.hpp>

#include "Output.hpp"
#include "ProgressLine.hpp"
#include "Session.hpp"
#include "arguments.hpp"
#include "commands.hpp"
#include "failures.hpp"
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
/// @throws ShellFailure where that makes a difference
void refuseOtherFiles(const git::BranchManager &manager, const std::string &name)
{
    const std::optional<std::string> branch =
        findRevision(manager, "refs/heads/" + name + "^{tree}");
    if (branch && findRevision(manager, name + "^{tree}") != branch)
    {
        throw ShellFailure(
            say("Nothing was switched: there is also a tag %1%, and its files would be written "
                "instead of the\nbranch's. Rename the tag or the branch first.",
                name));
    }
}

class SwitchCommand : public Command
{
  public:
    void declare(CLI::App &line) override
    {
        name_ = declareName(line, "NAME", say("A local branch"))->required();
        line.footer(say(
            "Makes the branch the current one, and writes its files. Uncommitted changes to a file "
            "are kept if\nthe file is the same in both branches; otherwise switch refuses. Ignored "
            "files that the branch\ntracks are overwritten without a copy.\n\nCtrl-C stops it "
            "until the first file is written: nothing has changed then."));
    }

    ExitStatus run(Session &session) override
    {
        const auto manager = git::BranchManager::create(session.adapter());
        const std::string name = name_->results().front();
        if (!isBranch(*manager, name))
        {
            const bool isCommit = findRevision(*manager, name + "^{commit}").has_value();
            throw ShellFailure(
                say("There is no branch '%1%'.", showName(name)) +
                (isCommit ? ' ' + say("Use \"%1%\".", "git switch --detach " + showName(name))
                          : suggestBranch(*manager, name)));
        }
        refuseOtherFiles(*manager, name);
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
            const ExitStatus status = reportFailure();
            tellSwitchObstacles(session.adapter(), manager, name);
            return status;
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
