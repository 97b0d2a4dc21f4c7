// SPDX-License-Identifier: MIT
#include <CLI/CLI.hpp>

#include "Output.hpp"
#include "Session.hpp"
#include "commands.hpp"
#include "failures.hpp"
#include "fl/i18n/convert.hpp"
#include "names.hpp"
#include "revisions.hpp"
#include "texts.hpp"
#include "vclink/git/BranchManager.hpp"
#include "vclink/git/LibGit2Exception.hpp"

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
        const std::string name = findName(*manager);
        session.output().write(quoteName(fl::i18n::utf8_to_ustring(name)) + '\n');
        return Done;
    }

  private:
    static std::string findName(const git::BranchManager &manager)
    {
        constexpr int isUnborn = -9; // GIT_EUNBORNBRANCH
        try
        {
            return manager.getCurrentBranch().getName();
        }
        catch (const git::LibGit2Exception &failure)
        {
            if (failure.getError().getCode() == isUnborn)
            {
                throw ShellFailure(say("There is no current branch: nothing was committed yet."));
            }
            if (findRevision(manager, "HEAD"))
            {
                throw ShellFailure(
                    say("There is no current branch: HEAD is at a commit, not at a branch."));
            }
            throw;
        }
    }
};

} // namespace

std::unique_ptr<Command> makeCurrentCommand()
{
    return std::make_unique<CurrentCommand>();
}

} // namespace vclink::shell
