// SPDX-License-Identifier: MIT
#include <string>

#include <CLI/CLI.hpp>

#include "Output.hpp"
#include "Session.hpp"
#include "arguments.hpp"
#include "commands.hpp"
#include "failures.hpp"
#include "names.hpp"
#include "revisions.hpp"
#include "runStoppable.hpp"
#include "suggestions.hpp"
#include "texts.hpp"
#include "vclink/git/BranchManager.hpp"
#include "vclink/git/LibGit2Exception.hpp"

namespace vclink::shell
{
namespace
{

/// Whether a text means a commit, and is not the name of a reference.
bool isUnnamedCommit(const git::BranchManager &manager, const std::string &text)
{
    const auto exists = [&](const char *folder) { return findRevision(manager, folder + text); };
    // No name of a reference has these.
    const bool isNamed = text.find_first_of("~^:") == std::string::npos &&
                         (text == "HEAD" || exists("refs/heads/") || exists("refs/tags/") ||
                          exists("refs/remotes/"));
    return !isNamed && findRevision(manager, text + "^{commit}");
}

class BranchCommand : public Command
{
  public:
    void declare(CLI::App &line) override
    {
        name_ = declareName(line, "NAME", say("The branch"))->required();
        start_ =
            declareName(line, "START",
                        say("Where the new branch begins: a branch, or a tag that is no object "
                            "of\nits own; HEAD if it is left out"));
        line.add_flag("-d", deletes_, say("Delete the branch, merged or not"));
        line.callback([this] { checkStart(); });
        line.footer(say("Makes or deletes a branch. The current branch stays the same, and can't "
                        "be deleted."));
    }

    ExitStatus run(Session &session) override
    {
        const auto manager = git::BranchManager::create(session.adapter());
        const std::string name = name_->results().front();
        // The way back from a deletion.
        const std::string tip = findRevision(*manager, "refs/heads/" + name).value_or("");
        if (deletes_ && !isBranch(*manager, name))
        {
            throw ShellFailure(say("There is no branch '%1%'.", showName(name)) +
                               suggestBranch(*manager, name));
        }
        try
        {
            const ExitStatus status =
                runStoppable(session, Stops::Never, [&] { act(*manager, name); });
            if (status == Done)
            {
                remark(deletes_ ? say("Deleted the branch %1%, which was at %2%.", name, tip)
                                : say("Made the branch %1%.", name));
            }
            return status;
        }
        catch (const git::LibGit2Exception &)
        {
            if (!deletes_ && !findRevision(*manager, start()))
            {
                if (start() == "HEAD")
                {
                    throw ShellFailure(say("There is no commit yet that a branch could begin at."));
                }
                throw ShellFailure(
                    say("There is no branch and no commit '%1%'.", showName(start())) +
                    suggestBranch(*manager, start()));
            }
            if (deletes_ || !isUnnamedCommit(*manager, start()))
            {
                throw;
            }
            reportFailure();
            complain(say("START must be the name of a branch or a tag. For any other commit, use "
                         "\"git branch %1% %2%\".",
                         name, start()));
            return Failed;
        }
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
            manager.createBranch(git::BranchParameters(name, start()));
        }
    }

    std::string start() const
    {
        return start_->empty() ? "HEAD" : start_->results().front();
    }

    void checkStart() const
    {
        if (deletes_ && !start_->empty())
        {
            throw CLI::ValidationError("START", say("is not for a branch to delete"));
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
