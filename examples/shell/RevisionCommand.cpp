// SPDX-License-Identifier: MIT
#include <CLI/CLI.hpp>

#include "Output.hpp"
#include "Session.hpp"
#include "arguments.hpp"
#include "commands.hpp"
#include "texts.hpp"
#include "vclink/git/BranchManager.hpp"

namespace vclink::shell
{
namespace
{

class RevisionCommand : public Command
{
  public:
    void declare(CLI::App &line) override
    {
        name_ =
            declareName(line, "NAME", say("A revision as git reads it, e.g. main~2 or HEAD:file"))
                ->required();
    }

    ExitStatus run(Session &session) override
    {
        const auto manager = git::BranchManager::create(session.adapter());
        session.output().write(manager->getRevision(name_->results().front()) + '\n');
        return Done;
    }

  private:
    const CLI::Option *name_ = nullptr;
};

} // namespace

std::unique_ptr<Command> makeRevisionCommand()
{
    return std::make_unique<RevisionCommand>();
}

} // namespace vclink::shell
