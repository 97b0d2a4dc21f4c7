// SPDX-License-Identifier: MIT
#include <CLI/CLI.hpp>

#include "Output.hpp"
#include "Session.hpp"
#include "commands.hpp"
#include "fl/i18n/convert.hpp"
#include "names.hpp"
#include "texts.hpp"
#include "vclink/git/BranchManager.hpp"

namespace vclink::shell
{
namespace
{

class CurrentCommand : public Command
{
  public:
    void declare(CLI::App &line) override
    {
        line.footer(say("There is none before the first commit, nor while a commit is checked "
                        "out instead of a branch."));
    }

    ExitStatus run(Session &session) override
    {
        const auto manager = git::BranchManager::create(session.adapter());
        const std::string name = manager->getCurrentBranch().getName();
        session.output().write(quoteName(fl::i18n::utf8_to_ustring(name)) + '\n');
        return Done;
    }
};

} // namespace

std::unique_ptr<Command> makeCurrentCommand()
{
    return std::make_unique<CurrentCommand>();
}

} // namespace vclink::shell
