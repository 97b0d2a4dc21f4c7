// SPDX-License-Identifier: MIT
#include <vector>

#include <CLI/CLI.hpp>

#include "Output.hpp"
#include "Session.hpp"
#include "arguments.hpp"
#include "commands.hpp"
#include "links.hpp"
#include "namedPaths.hpp"
#include "names.hpp"
#include "refusals.hpp"
#include "runStoppable.hpp"
#include "states.hpp"
#include "texts.hpp"

namespace vclink::shell
{
namespace
{

class AddCommand : public Command
{
  public:
    void declare(CLI::App &line) override
    {
        paths_ = declarePaths(line, say("New files, and folders: all new files below them"));
        line.add_flag("-A,--all", addsAll_, say("All new files of the working copy"));
        line.callback(
            [this]
            {
                if (paths_->empty() && !addsAll_)
                {
                    throw CLI::RequiredError("PATH");
                }
            });
        line.footer(say("The files are in the next commit. A folder's ignored files are left out, "
                        "and a name of one is\nrefused; so is a file that Git tracks already: its "
                        "changes are in the next commit anyway."));
    }

    ExitStatus run(Session &session) override
    {
        CMAdapter &adapter = session.adapter();
        const upath &root = adapter.getRootFolder();
        const std::vector<NamedPath> paths =
            lookUp(adapter, addsAll_ ? std::vector<std::string>{nativePath(root).string()}
                                     : paths_->results());
        refuseUnless(say("Nothing was added"), paths,
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
        refuseStrays(say("Nothing was added"), adapter, paths, list,
                     [](FileState::State state) { return isNew(state) || isInConflict(state); });
        const ExitStatus status = runStoppable(session, Stops::Never,
                                               [&] { adapter.addFiles(literalNames(list, root)); });
        if (status != Done)
        {
            return status;
        }
        const FileStateMap leftOut = findLeftOut(adapter, files, isNew);
        remark(files.empty() ? say("There is no new file to add.")
                             : say("Added %1%.", countFiles(files.size() - leftOut.size())));
        return tellLeftOut(say("Others were not added"), root, leftOut);
    }

  private:
    static bool isNew(FileState::State state)
    {
        return state == FileState::Unversioned;
    }

    const CLI::Option *paths_ = nullptr;
    bool addsAll_ = false;
};

} // namespace

std::unique_ptr<Command> makeAddCommand()
{
    return std::make_unique<AddCommand>();
}

} // namespace vclink::shell
