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
#include "mergeLeftovers.hpp"
#include "mergeObstacles.hpp"
#include "namedPaths.hpp"
#include "revisions.hpp"
#include "runStoppable.hpp"
#include "states.hpp"
#include "unfinished.hpp"
#include "workingCopy.hpp"

namespace vclink::shell
{
namespace
{

/// GIT_ECONFLICT.
constexpr int wouldLoseWork = -13;

bool isInOrder(const git::BranchManager &manager)
{
    return manager.getRepositoryState() == "Normal";
}

void tellIfAny(const std::string &begin, const FileStateMap &files, const upath &root,
               const std::string &end)
{
    if (!files.empty())
    {
        complain(begin + listNames(files, root) + end);
    }
}

class MergeCommand : public Command
{
  public:
    void declare(CLI::App &line) override
    {
        name_ = declareName(line, "NAME",
                            "A branch, or any revision of a commit, e.g. v1^{commit} for a tag")
                    ->required();
        line.footer("Brings the changes of another branch into the current one. Tells what came of "
                    "it: \"Already up to\n"
                    "date.\", a fast-forward, or a merge commit. Files that are given to a merge "
                    "driver by the attribute\n"
                    "\"merge\" are merged by it; see config for the tool that comes along.\n\n"
                    "After conflicts the files in conflict are named, and the status is 1. Make "
                    "each as it should be,\n"
                    "mark it with resolved, and conclude the merge with commit. A merge that would "
                    "lose uncommitted\n"
                    "changes or untracked files is refused, and changes nothing.\n\n"
                    "Ctrl-C stops it, as long as it still looks for what is to be written: nothing "
                    "has changed then.");
    }

    ExitStatus run(Session &session) override
    {
        const auto manager = git::BranchManager::create(session.adapter());
        const std::string name = name_->results().front();
        const std::optional<std::string> before = findRevision(*manager, "HEAD");
        const std::optional<std::string> theirs = findRevision(*manager, name);
        const bool wasInOrder = isInOrder(*manager);
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
            tellWayOn(session.adapter(), notes);
        }
        else if (notes.failure == wouldLoseWork)
        {
            tellWhatIsInTheWay(session.adapter(), theirs);
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
            return runStoppable(session, [&manager, &name] { manager.merge(name); });
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
            output.write("Already up to date.\n");
        }
        else if (after == theirs)
        {
            output.write("Fast-forward to " + after + ".\n");
        }
        else
        {
            output.write("Merge commit " + after + ".\n");
        }
        output.flush();
    }

    /// What might have been lost, and how to get it out of the way.
    static void tellWhatIsInTheWay(CMAdapter &adapter, const std::optional<std::string> &theirs)
    {
        const upath &root = adapter.getRootFolder();
        const MergeObstacles obstacles = findMergeObstacles(adapter, theirs);
        tellIfAny("These files have uncommitted changes:", obstacles.changed, root, "");
        tellIfAny("These files are not tracked, and the other side has something in their place:",
                  obstacles.untracked, root, "");
        tellIfAny("The folders of these submodules are missing:", obstacles.missingSubmodules, root,
                  "\nBring them back with \"git submodule update --init\" first. A commit would "
                  "leave these submodules out.");
        complain("Nothing was merged. Commit the changes that would be lost, or move the files "
                 "out of the way, and\nmerge again.");
    }

    /// How to finish what was under way before.
    static void tellUnfinished(CMAdapter &adapter)
    {
        const std::string text = describeUnfinishedMerge(adapter);
        if (!text.empty())
        {
            complain(text);
        }
    }

    /// What has to be done after a merge that stopped half-way.
    static void tellWayOn(CMAdapter &adapter, const MergeNotes &notes)
    {
        const upath &root = adapter.getRootFolder();
        const FileStateMap states = wholeStates(adapter);
        const FileStateMap conflicts = filter(states, isInConflict);
        if (conflicts.empty())
        {
            complain("No file is in conflict. Conclude the merge with \"vclink-shell commit\".");
            return;
        }
        tellIfAny("These files are in conflict:", conflicts, root,
                  "\nMake each as it should be, and mark it with \"vclink-shell resolved\". Then "
                  "conclude the merge\nwith \"vclink-shell commit\".");
        tellIfAny("A merge command refused these files. They may be a mix of both sides without "
                  "conflict markers:",
                  findRefused(adapter, conflicts, notes), root, "");
        tellIfAny("These files have another name now, because something else has theirs:",
                  findSetAside(root, states), root,
                  "\nThe merge leaves them out: move what you want to keep to its place, and add "
                  "it.");
    }

    const CLI::Option *name_ = nullptr;
};

} // namespace

std::unique_ptr<Command> makeMergeCommand()
{
    return std::make_unique<MergeCommand>();
}

} // namespace vclink::shell
