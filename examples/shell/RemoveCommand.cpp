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

namespace vclink::shell
{
namespace
{

class RemoveCommand : public Command
{
  public:
    void declare(CLI::App &line) override
    {
        paths_ = declarePaths(line, "Tracked files, and folders: all tracked files below them")
                     ->required();
        line.footer(
            "The files are gone in the next commit, and Git tracks them no longer. They stay on "
            "the disk. A\n"
            "name that no tracked file has is refused, and nothing is removed then. Files that are "
            "removed\n"
            "already are passed over; when there are no others, that is an error. Below a folder\n"
            "files are removed too that a sparse checkout leaves out. A symbolic link that leads "
            "somewhere can't\n"
            "be removed: it would be followed.");
    }

    ExitStatus run(Session &session) override
    {
        CMAdapter &adapter = session.adapter();
        const upath &root = adapter.getRootFolder();
        const std::vector<NamedPath> paths = lookUp(adapter, paths_->results());
        refuseUnless("Nothing was removed", paths,
                     [&root](const NamedPath &named) { return explain(root, named); });
        const Cover removed = cover(root, paths, isRemovable, LinkNames::None);
        refuseStrays("Nothing was removed", adapter, paths, removed.list, isRemovable);
        const ExitStatus status = runStoppable(session, [&] { adapter.removeFiles(removed.list); });
        if (status != Done)
        {
            return status;
        }
        const FileStateMap leftOut = findLeftOut(adapter, removed.files, isRemovable);
        remark("Removed " + countFiles(removed.files.size() - leftOut.size()) +
               " from Git, not from the disk.");
        return tellLeftOut("Not all were removed", root, leftOut);
    }

  private:
    static bool isRemovable(FileState::State state)
    {
        return isTracked(state) && state != FileState::Deleted;
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
        return isUseless ? "there are only symbolic links in it, which would be followed" : "";
    }

    const CLI::Option *paths_ = nullptr;
};

} // namespace

std::unique_ptr<Command> makeRemoveCommand()
{
    return std::make_unique<RemoveCommand>();
}

} // namespace vclink::shell
