// SPDX-License-Identifier: MIT
#include <CLI/CLI.hpp>

#include "Output.hpp"
#include "Session.hpp"
#include "commands.hpp"
#include "failures.hpp"
#include "texts.hpp"
#include "unfinished.hpp"
#include "vclink/git/BranchManager.hpp"

namespace vclink::shell
{
namespace
{

class StateCommand : public Command
{
  public:
    void declare(CLI::App &line) override
    {
        line.footer(say("\"Normal\", or the operation that is not finished: \"Conflicts\" is a "
                        "merge, a revert or a cherry-pick,\neven if no file is in conflict."));
    }

    ExitStatus run(Session &session) override
    {
        const auto manager = git::BranchManager::create(session.adapter());
        session.output().write(manager->getRepositoryState() + '\n');
        session.output().flush();
        if (isMergeInterrupted(session.adapter()))
        {
            complain(describeUnfinishedMerge(session.adapter()));
        }
        return Done;
    }
};

} // namespace

std::unique_ptr<Command> makeStateCommand()
{
    return std::make_unique<StateCommand>();
}

} // namespace vclink::shell
