// SPDX-License-Identifier: MIT
#include <memory>
#include <optional>
#include <string>

#include <CLI/CLI.hpp>

#include "Output.hpp"
#include "ProgressLine.hpp"
#include "Session.hpp"
#include "arguments.hpp"
#include "commands.hpp"
#include "failures.hpp"
#include "namedPaths.hpp"
#include "revisions.hpp"
#include "runStoppable.hpp"
#include "states.hpp"

namespace vclink::shell
{
namespace
{

// Some seconds' worth.
constexpr std::size_t historyLimit = 10'000;

bool isInOrder(const git::BranchManager &manager)
{
    return manager.getRepositoryState() == "Normal";
}

/// Whether a merge may put such a file back, or is refused for it. Unknown is also what a link is
/// that has taken a file's place.
bool isPutBack(FileState::State state)
{
    return state == FileState::Modified || state == FileState::Missing ||
           state == FileState::Unknown;
}

class MergeCommand : public Command
{
  public:
    void declare(CLI::App &line) override
    {
        name_ = declareName(line, "NAME",
                            "A branch, or any revision of a commit, e.g. v1^{commit} for a tag")
                    ->required();
        line.add_flag("--force", loses_,
                      "Merge beside modified and missing files: missing ones come back, and the\n"
                      "merge is refused if it would lose changes");
        line.footer("Brings the changes of another branch into the current one. Tells what came of "
                    "it: \"Already up to\n"
                    "date.\", a fast-forward, or a merge commit. Files that are given to a merge "
                    "driver by the attribute\n"
                    "\"merge\" are merged by it; see config for the tool that comes along.\n\n"
                    "After conflicts the files in conflict are named, and the status is 1. Make "
                    "each as it should be,\n"
                    "mark it with resolved, and conclude the merge with commit.\n\n"
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
        // What can't be merged at all is told by the back end.
        if (before && theirs && wasInOrder && !loses_)
        {
            refuseChanges(session.adapter(), *manager, *theirs);
        }
        const ExitStatus status = merge(session, *manager, name);
        if (status == Done)
        {
            tellResult(session.output(), before, theirs, manager->getHeadRevision());
        }
        else if (wasInOrder && !isInOrder(*manager))
        {
            tellWayOn(session.adapter());
        }
        return status;
    }

  private:
    /// @throws ShellFailure when there are changes that a merge could throw away
    static void refuseChanges(CMAdapter &adapter, const git::BranchManager &manager,
                              const std::string &theirs)
    {
        const upath &root = adapter.getRootFolder();
        const FileStateMap changed = filter(adapter.getFolderStates(root), isPutBack);
        if (!changed.empty() && !isInHistory(manager, theirs, historyLimit))
        {
            throw ShellFailure(
                "Nothing was merged. These files are changed, and a merge could put them back as "
                "they are in\nthe last commit, or be refused:" +
                listNames(changed, root) +
                "\nCommit the changes first, or throw them away with \"vclink-shell revert\". With "
                "--force the merge\nis tried beside them.");
        }
    }

    /// Tells of a failure.
    static ExitStatus merge(Session &session, git::BranchManager &manager, const std::string &name)
    {
        try
        {
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

    /// What has to be done after a merge that stopped half-way.
    static void tellWayOn(CMAdapter &adapter)
    {
        const upath &root = adapter.getRootFolder();
        const FileStateMap conflicts = filter(adapter.getFolderStates(root), isInConflict);
        if (conflicts.empty())
        {
            complain("No file is in conflict. Conclude the merge with \"vclink-shell commit\".");
            return;
        }
        complain("These files are in conflict:" + listNames(conflicts, root) +
                 "\nMake each as it should be, and mark it with \"vclink-shell resolved\". Then "
                 "conclude the merge\nwith \"vclink-shell commit\".");
    }

    const CLI::Option *name_ = nullptr;
    bool loses_ = false;
};

} // namespace

std::unique_ptr<Command> makeMergeCommand()
{
    return std::make_unique<MergeCommand>();
}

} // namespace vclink::shell
