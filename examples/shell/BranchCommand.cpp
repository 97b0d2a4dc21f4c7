// SPDX-License-Identifier: MIT
#include <string>

#include <CLI/CLI.hpp>

#include "Output.hpp"
#include "Session.hpp"
#include "arguments.hpp"
#include "commands.hpp"
#include "runStoppable.hpp"
#include "vclink/git/BranchManager.hpp"

namespace vclink::shell
{
namespace
{

class BranchCommand : public Command
{
  public:
    void declare(CLI::App &line) override
    {
        name_ = declareName(line, "NAME", "The branch")->required();
        start_ = declareName(line, "START",
                             "What a new branch begins at: a branch, or a tag that "
                             "is no object\nof its own");
        line.add_flag("-d", deletes_, "Delete the branch");
        line.callback([this] { checkStart(); });
        line.footer("Makes a branch, or deletes one, merged or not. The current branch stays what "
                    "it is, and can't\nbe deleted.");
    }

    ExitStatus run(Session &session) override
    {
        const auto manager = git::BranchManager::create(session.adapter());
        const std::string name = name_->results().front();
        const ExitStatus status = runStoppable(session, [&] { act(*manager, name); });
        if (status == Done)
        {
            remark((deletes_ ? "Deleted the branch " : "Made the branch ") + name + '.');
        }
        return status;
    }

  private:
    void act(git::BranchManager &manager, const std::string &name) const
    {
        if (deletes_)
        {
            manager.deleteBranch(name);
        }
        else
        {
            manager.createBranch(git::BranchParameters(name, start_->results().front()));
        }
    }

    void checkStart() const
    {
        if (deletes_ && !start_->empty())
        {
            throw CLI::ValidationError("START", "it is not for a branch to delete");
        }
        if (!deletes_ && start_->empty())
        {
            throw CLI::RequiredError("START");
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
