// SPDX-License-Identifier: MIT
#include <vector>

#include <CLI/CLI.hpp>

#include "Output.hpp"
#include "Session.hpp"
#include "arguments.hpp"
#include "commands.hpp"
#include "folderCover.hpp"
#include "namedPaths.hpp"
#include "refusals.hpp"
#include "runStoppable.hpp"
#include "states.hpp"

namespace vclink::shell
{
namespace
{

class RevertCommand : public Command
{
  public:
    void declare(CLI::App &line) override
    {
        paths_ = declarePaths(line, "Tracked files, and folders: all tracked files below them")
                     ->required();
        line.footer(
            "Throws away all changes to the files, staged or not: they are as in the last commit, "
            "and back\n"
            "on the disk where they were gone. A file that was only added is new again, and keeps "
            "its text.\n"
            "Other new files are left alone below a folder, and refused by name. While one of the "
            "files is in\n"
            "a conflict, nothing is reverted. A symbolic link is put back itself, not what it "
            "leads to. Below\n"
            "a folder, files that a sparse checkout leaves out are written too.\n\n"
            "Ctrl-C stops it, as long as it still looks for what is to be written. What has been "
            "staged may\n"
            "be reset then, and the files are as they were. Run it again, or go on working.");
    }

    ExitStatus run(Session &session) override
    {
        CMAdapter &adapter = session.adapter();
        const upath &root = adapter.getRootFolder();
        const std::vector<NamedPath> paths = lookUp(adapter, paths_->results());
        refuseUnless("Nothing was reverted", paths,
                     [&root](const NamedPath &named) { return explainUntracked(root, named); });
        const Cover reverted = cover(root, paths, isChanged, LinkNames::Patterns);
        refuseStrays("Nothing was reverted", adapter, paths, reverted.list, isChanged);
        const ExitStatus status =
            runStoppable(session, [&] { adapter.revertFiles(reverted.list); });
        if (status != Done)
        {
            return status;
        }
        const FileStateMap leftOut = findLeftOut(adapter, reverted.files, isChanged);
        remark(reverted.files.empty()
                   ? "There is no change to revert."
                   : "Reverted " + countFiles(reverted.files.size() - leftOut.size()) + '.');
        return tellLeftOut("Not all were reverted", root, leftOut);
    }

  private:
    const CLI::Option *paths_ = nullptr;
};

} // namespace

std::unique_ptr<Command> makeRevertCommand()
{
    return std::make_unique<RevertCommand>();
}

} // namespace vclink::shell
