// SPDX-License-Identifier: MIT
#include <vector>

#include <CLI/CLI.hpp>

#include "Output.hpp"
#include "Session.hpp"
#include "arguments.hpp"
#include "commands.hpp"
#include "links.hpp"
#include "namedPaths.hpp"
#include "refusals.hpp"
#include "runStoppable.hpp"
#include "states.hpp"

namespace vclink::shell
{
namespace
{

class AddCommand : public Command
{
  public:
    void declare(CLI::App &line) override
    {
        paths_ = declarePaths(line, "New files, and folders: all new files below them")->required();
        line.footer("The files are in the next commit. Ignored files are left out below a folder, "
                    "and refused by\n"
                    "name. So is a file that Git tracks already: its changes are in the next "
                    "commit anyway, see\n"
                    "commit. When one is refused, nothing is added. A symbolic link that leads "
                    "somewhere can't be\n"
                    "added: it would be followed.");
    }

    ExitStatus run(Session &session) override
    {
        CMAdapter &adapter = session.adapter();
        const upath &root = adapter.getRootFolder();
        const std::vector<NamedPath> paths = lookUp(adapter, paths_->results());
        refuseUnless("Nothing was added", paths,
                     [&root](const NamedPath &named) {
                         return named.states.empty() ? explainAbsence(root, named)
                                                     : explainLink(named, "git add");
                     });
        FileStateMap files;
        for (const NamedPath &named : paths)
        {
            FileStateMap chosen = named.isFolder ? filter(named.states, isNew) : named.states;
            files.merge(chosen);
        }
        const std::vector<upath> list = addressable(filterFollowed(files, root, false), root);
        refuseStrays("Nothing was added", adapter, paths, list,
                     [](FileState::State) { return true; });
        const ExitStatus status = runStoppable(session, [&] { adapter.addFiles(list); });
        if (status != Done)
        {
            return status;
        }
        const FileStateMap leftOut = findLeftOut(adapter, files, isNew);
        remark(files.empty() ? "There is no new file to add."
                             : "Added " + countFiles(files.size() - leftOut.size()) + '.');
        return tellLeftOut("Others were not added", root, leftOut);
    }

  private:
    static bool isNew(FileState::State state)
    {
        return state == FileState::Unversioned;
    }

    const CLI::Option *paths_ = nullptr;
};

} // namespace

std::unique_ptr<Command> makeAddCommand()
{
    return std::make_unique<AddCommand>();
}

} // namespace vclink::shell
