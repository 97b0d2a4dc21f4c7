// SPDX-License-Identifier: MIT
#include <string>

#include <CLI/CLI.hpp>

#include "Output.hpp"
#include "Session.hpp"
#include "arguments.hpp"
#include "commands.hpp"
#include "failures.hpp"
#include "names.hpp"
#include "suggestions.hpp"
#include "texts.hpp"
#include "vclink/git/BranchManager.hpp"
#include "vclink/git/LibGit2Exception.hpp"

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
        const std::string name = name_->results().front();
        try
        {
            session.output().write(manager->getRevision(name) + '\n');
        }
        catch (const git::LibGit2Exception &failure)
        {
            explain(*manager, name, failure.getError().getCode());
            throw;
        }
        return Done;
    }

  private:
    /// @throws ShellFailure if the name is why nothing is found
    static void explain(const git::BranchManager &manager, const std::string &name, int code)
    {
        constexpr int isMissing = -3;    // GIT_ENOTFOUND
        constexpr int isAmbiguous = -5;  // GIT_EAMBIGUOUS
        constexpr int isMalformed = -12; // GIT_EINVALIDSPEC
        if (code == isMissing)
        {
            throw ShellFailure(say("There is no revision '%1%'.", showName(name)) +
                               suggestBranch(manager, name));
        }
        if (code == isAmbiguous)
        {
            throw ShellFailure(
                say("More than one object has an id that begins with '%1%', or the beginning is "
                    "too short. Give more of it.",
                    showName(name)));
        }
        if (code == isMalformed)
        {
            throw ShellFailure(say("'%1%' is not a revision. \"git help revisions\" describes how "
                                   "one is written; a range is none.",
                                   showName(name)));
        }
    }

    const CLI::Option *name_ = nullptr;
};

} // namespace

std::unique_ptr<Command> makeRevisionCommand()
{
    return std::make_unique<RevisionCommand>();
}

} // namespace vclink::shell
