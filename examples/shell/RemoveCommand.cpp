// SPDX-License-Identifier: MIT
#include <string>
#include <vector>

#include <CLI/CLI.hpp>

#include "Output.hpp"
#include "Session.hpp"
#include "arguments.hpp"
#include "commands.hpp"
#include "folderCover.hpp"
#include "links.hpp"
#include "namedPaths.hpp"
#include "refusals.hpp"
#include "runStoppable.hpp"
#include "states.hpp"
#include "texts.hpp"

namespace vclink::shell
{
namespace
{

class RemoveCommand : public Command
{
  public:
    void declare(CLI::App &line) override
    {
        paths_ = declarePaths(line, say("Tracked files, and folders: all tracked files below them"))
                     ->required();
        line.footer(say("The next commit removes the files. They stay on the disk, untracked."));
    }

    ExitStatus run(Session &session) override
    {
        CMAdapter &adapter = session.workingCopy();
        const upath &root = adapter.getRootFolder();
        const std::vector<NamedPath> paths = lookUp(adapter, paths_->results());
        refuseUnless(say("Nothing was removed"), paths,
                     [&root](const NamedPath &named) { return explain(root, named); });
        const Cover removed = choose(root, paths);
        refuseStrays(say("Nothing was removed"), adapter, paths, removed.list, isRemovable);
        const ExitStatus status =
            runStoppable(session, Stops::Never, [&] { adapter.removeFiles(removed.list); });
        if (status != Done)
        {
            return status;
        }
        const FileStateMap leftOut = findLeftOut(adapter, removed.files, isRemovable);
        const std::size_t count = removed.files.size() - leftOut.size();
        if (count != 0)
        {
            remark(say("Removed %1% from Git, not from the disk.", countFiles(count)));
        }
        return tellLeftOut(count == 0 ? say("Nothing was removed") : say("Not all were removed"),
                           root, leftOut);
    }

  private:
    static bool isRemovable(FileState::State state)
    {
        return isTracked(state) && state != FileState::Deleted;
    }

    /// If both names of a renamed file are told to it, the back end removes neither: then each file
    /// is named by itself, and only those that are to be removed.
    static Cover choose(const upath &root, const std::vector<NamedPath> &paths)
    {
        Cover chosen;
        bool hasDeleted = false;
        bool hasAdded = false;
        for (const NamedPath &named : paths)
        {
            FileStateMap meant = filter(named.states, isRemovable);
            hasDeleted = hasDeleted || meant.size() != filter(named.states, isTracked).size();
            hasAdded = hasAdded || !filter(meant, isAdded).empty();
            const std::vector<upath> names = addressable(filterFollowed(meant, root, false), root);
            chosen.list.insert(chosen.list.end(), names.begin(), names.end());
            chosen.files.merge(meant);
        }
        return hasDeleted && hasAdded ? chosen : cover(root, paths, isRemovable, LinkNames::None);
    }

    static bool isAdded(FileState::State state)
    {
        return state == FileState::Added;
    }

    static std::string explain(const upath &root, const NamedPath &named)
    {
        const std::string reason = explainUntracked(root, named);
        if (!reason.empty() || named.isLink)
        {
            return reason.empty() ? explainLink(named, "git rm --cached") : reason;
        }
        const FileStateMap meant = filter(named.states, isRemovable);
        const bool isUseless =
            named.isFolder && !meant.empty() && filterFollowed(meant, root, false).empty();
        return isUseless ? say("it has only symbolic links, which would be followed") : "";
    }

    const CLI::Option *paths_ = nullptr;
};

} // namespace

std::unique_ptr<Command> makeRemoveCommand()
{
    return std::make_unique<RemoveCommand>();
}

} // namespace vclink::shell
