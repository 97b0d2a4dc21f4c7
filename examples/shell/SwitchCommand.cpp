// SPDX-License-Identifier: MIT
#include <optional>
#include <string>

#include <CLI/CLI.hpp>

#include "Output.hpp"
#include "Session.hpp"
#include "arguments.hpp"
#include "commands.hpp"
#include "failures.hpp"
#include "revisions.hpp"
#include "runStoppable.hpp"

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
        throw ShellFailure("Nothing was switched: " + name +
                           " is a tag too, whose files would be taken for the branch's.");
    }
}

class SwitchCommand : public Command
{
  public:
    void declare(CLI::App &line) override
    {
        name_ = declareName(line, "NAME", "A local branch")->required();
        line.footer(
            "Puts the branch's files on the disk, and makes it the current one. Changes to files "
            "stay where\nboth branches have the same text; otherwise nothing is switched. An "
            "ignored file that the branch\ntracks is overwritten.\n\n"
            "Ctrl-C stops it, as long as it still looks for what is to be written: nothing has "
            "changed then.");
    }

    ExitStatus run(Session &session) override
    {
        const auto manager = git::BranchManager::create(session.adapter());
        const std::string name = name_->results().front();
        refuseOtherFiles(*manager, name);
        const ExitStatus status =
            runStoppable(session, [&manager, &name] { manager->switchBranch(name); });
        if (status == Done)
        {
            remark("The current branch is " + name + '.');
        }
        return status;
    }

  private:
    const CLI::Option *name_ = nullptr;
};

} // namespace

std::unique_ptr<Command> makeSwitchCommand()
{
    return std::make_unique<SwitchCommand>();
}

} // namespace vclink::shell
