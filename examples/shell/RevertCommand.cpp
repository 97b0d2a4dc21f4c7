// SPDX-License-Identifier: MIT
#include <exception>
#include <string>
#include <vector>

#include <CLI/CLI.hpp>

#include "Output.hpp"
#include "ProgressLine.hpp"
#include "Session.hpp"
#include "arguments.hpp"
#include "commands.hpp"
#include "discardedContents.hpp"
#include "failures.hpp"
#include "folderCover.hpp"
#include "namedPaths.hpp"
#include "refusals.hpp"
#include "runStoppable.hpp"
#include "states.hpp"
#include "texts.hpp"
#include "vclink/PollableTerminator.hpp"
#include "vclink/util/exception/CancelledOperationException.hpp"

namespace vclink::shell
{
namespace
{

class RevertCommand : public Command
{
  public:
    void declare(CLI::App &line) override
    {
        paths_ = declarePaths(line, say("Tracked files, and folders: all tracked files below them"))
                     ->required();
        line.add_flag("--forget", forgets_, say("Keep no copy of what is discarded"));
        line.footer(say("Discards all changes to the files, staged or not: they become as in the "
                        "last commit. What is\ndiscarded is kept as Git objects, and a line says "
                        "how to restore it. A file that was only added\nbecomes untracked, and "
                        "keeps its text.\n\n"
                        "Ctrl-C stops it until the first file is written: the files are as they "
                        "were then, but staged changes\nmay be unstaged."));
    }

    ExitStatus run(Session &session) override
    {
        CMAdapter &adapter = session.adapter();
        const upath &root = adapter.getRootFolder();
        std::vector<NamedPath> paths = lookUp(adapter, paths_->results());
        addOverlooked(adapter, paths);
        refuseUnless(say("Nothing was reverted"), paths,
                     [&root](const NamedPath &named) { return explainUntracked(root, named); });
        const Cover reverted = cover(root, paths, isChanged, LinkNames::Patterns);
        refuseStrays(say("Nothing was reverted"), adapter, paths, reverted.list, isChanged);
        const ExitStatus status =
            runStoppable(session, Stops::BeforeWriting,
                         [&]
                         {
                             const WayBack wayBack =
                                 forgets_ ? WayBack() : keep(session, paths, reverted);
                             revert(session, reverted.list, wayBack);
                         });
        if (status != Done)
        {
            return status;
        }
        const FileStateMap leftOut = findLeftOut(adapter, reverted.files, isChanged);
        remark(reverted.files.empty()
                   ? say("There is no change to revert.")
                   : say("Reverted %1%.", countFiles(reverted.files.size() - leftOut.size())));
        return tellLeftOut(say("Not all were reverted"), root, leftOut);
    }

  private:
    static void tell(const std::string &wayBack)
    {
        if (!wayBack.empty())
        {
            inform(wayBack);
        }
    }

    /// @throws CancelledOperationException if the person has asked to stop meanwhile
    static WayBack keep(Session &session, const std::vector<NamedPath> &paths,
                        const Cover &reverted)
    {
        PollableTerminator terminator(session.interactor()->getTerminator());
        WayBack wayBack = keepContents(session, paths, reverted.files);
        if (terminator.checkAndResetCancelledState())
        {
            throw util::exception::CancelledOperationException();
        }
        return wayBack;
    }

    /// Says how to restore what is discarded, once that may have been.
    static void revert(Session &session, const std::vector<upath> &files, const WayBack &wayBack)
    {
        try
        {
            session.adapter().revertFiles(files);
        }
        catch (const std::exception &failure)
        {
            session.progressLine().end();
            const bool isWriting = session.interactor()->isWriting();
            tell(isWriting ? wayBack.files : "");
            // A revert that is cancelled may have reset the index.
            const bool isCancelled =
                dynamic_cast<const util::exception::CancelledOperationException *>(&failure) !=
                nullptr;
            tell(isWriting || isCancelled ? wayBack.staged : "");
            throw;
        }
        session.progressLine().end();
        tell(wayBack.files);
        tell(wayBack.staged);
    }

    const CLI::Option *paths_ = nullptr;
    bool forgets_ = false;
};

} // namespace

std::unique_ptr<Command> makeRevertCommand()
{
    return std::make_unique<RevertCommand>();
}

} // namespace vclink::shell
