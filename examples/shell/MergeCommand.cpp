// SPDX-License-Identifier: MIT
#include <memory>
#include <optional>
#include <string>

#include <CLI/CLI.hpp>

#include "MergeLog.hpp"
#include "Output.hpp"
#include "ProgressLine.hpp"
#include "Session.hpp"
#include "arguments.hpp"
#include "commands.hpp"
#include "failures.hpp"
#include "fl/i18n/convert.hpp"
#include "foundation/core/except/IUserException.hpp"
#include "mergeReport.hpp"
#include "names.hpp"
#include "revisions.hpp"
#include "runStoppable.hpp"
#include "suggestions.hpp"
#include "texts.hpp"

namespace vclink::shell
{
namespace
{

bool isInOrder(const git::BranchManager &manager)
{
    return manager.getRepositoryState() == "Normal";
}

/// @throws ShellFailure if a name is not that of a commit
void refuseOtherThanCommits(const git::BranchManager &manager, const std::string &name,
                            const std::optional<std::string> &id)
{
    const std::optional<std::string> commit = findRevision(manager, name + "^{commit}");
    if (!commit && isUnreadable(manager, name))
    {
        throw ShellFailure(
            say("Nothing was merged: the commit of '%1%' can't be read.", showName(name)));
    }
    if (!commit)
    {
        throw ShellFailure(
            say("Nothing was merged: there is no branch and no commit '%1%'.", showName(name)) +
            suggestBranch(manager, name));
    }
    if (commit != id)
    {
        throw ShellFailure(
            say("Nothing was merged: '%1%' is an annotated tag.", showName(name)) + ' ' +
            say("Use \"%1%\".", "vclink-shell merge " + quoteForShell(name + "^{commit}")));
    }
}

class MergeCommand : public Command
{
  public:
    void declare(CLI::App &line) override
    {
        name_ =
            declareName(line, "NAME",
                        say("A branch, or any revision of a commit, e.g. v1^{commit} for a tag"))
                ->required();
        line.footer(say("Brings the changes of another branch into the current one: by a "
                        "fast-forward or a merge commit.\nRefuses to lose uncommitted changes or "
                        "untracked files.\n\n"
                        "After conflicts the status is 1. Resolve each file, mark it with "
                        "resolved, and conclude the merge\nwith commit; or undo the merge with "
                        "\"git merge --abort\".\n\n"
                        "Until the first file is written, Ctrl-C stops it: nothing has changed "
                        "then."));
    }

    ExitStatus run(Session &session) override
    {
        const auto manager = git::BranchManager::create(session.workingCopy());
        const std::string name = name_->results().front();
        const std::optional<std::string> before = findRevision(*manager, "HEAD");
        const std::optional<std::string> theirs = findRevision(*manager, name);
        const bool wasInOrder = isInOrder(*manager);
        if (wasInOrder)
        {
            refuseOtherThanCommits(*manager, name, theirs);
        }
        MergeNotes notes;
        const ExitStatus status = merge(session, *manager, name, notes);
        if (status == Done)
        {
            tellResult(session.output(), before, theirs, manager->getHeadRevision());
        }
        else if (!wasInOrder)
        {
            tellUnfinished(session.adapter());
        }
        else if (!isInOrder(*manager))
        {
            tellConflicts(session.adapter(), notes);
        }
        else
        {
            tellRefusal(session.adapter(), notes, theirs);
        }
        return status;
    }

  private:
    /// Reports a failure.
    static ExitStatus merge(Session &session, git::BranchManager &manager, const std::string &name,
                            MergeNotes &notes)
    {
        try
        {
            const MergeLog log(notes);
            return runStoppable(session, Stops::BeforeWriting,
                                [&manager, &name] { manager.merge(name); });
        }
        catch (const foundation::core::except::IUserException &failure)
        {
            notes.text = fl::i18n::ustring_to_utf8(failure.GetUnicodeMessageTxt());
            session.progressLine().clear();
            return reportFailure();
        }
        catch (...)
        {
            session.progressLine().clear();
            return reportFailure();
        }
    }

    static void tellResult(Output &output, const std::optional<std::string> &before,
                           const std::optional<std::string> &theirs, const std::string &after)
    {
        if (after == before)
        {
            output.write(say("Already up to date.") + '\n');
        }
        else if (after == theirs)
        {
            output.write(say("Fast-forward to %1%.", after) + '\n');
        }
        else
        {
            output.write(say("Merge commit %1%.", after) + '\n');
        }
        output.flush();
    }

    const CLI::Option *name_ = nullptr;
};

} // namespace

std::unique_ptr<Command> makeMergeCommand()
{
    return std::make_unique<MergeCommand>();
}

} // namespace vclink::shell
