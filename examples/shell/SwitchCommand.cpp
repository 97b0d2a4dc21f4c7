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
        throw ShellFailure(say("Nothing was switched: %1% is a tag too, whose files would be taken "
                               "for the branch's.",
                               name));
    }
}

class SwitchCommand : public Command
{
  public:
    void declare(CLI::App &line) override
    {
        name_ = declareName(line, "NAME", say("A local branch"))->required();
        line.footer(
            say("Writes the branch's files, and makes it the current one. Uncommitted "
                "changes stay if both branches\nhave the same text there; otherwise nothing "
                "is switched. Overwrites an ignored file that the branch\ntracks.\n\n"
                "Ctrl-C stops it until the first file is written: nothing has changed "
                "then."));
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
