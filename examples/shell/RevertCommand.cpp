// SPDX-License-Identifier: MIT
#include <algorithm>
#include <exception>
#include <filesystem>
#include <string>
#include <system_error>
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
#include "names.hpp"
#include "overlookedMarks.hpp"
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
        line.footer(say(
            "Discards all changes to the files, staged or not: they become as in the last "
            "commit. What is\ndiscarded is stored in the repository first, and the command "
            "that restores it is printed. A file\nthat was only added becomes untracked, and "
            "keeps its text.\n\nUntil the first file is written, Ctrl-C stops it. The files are "
            "unchanged then, but staged changes\nmay be unstaged."));
    }

    ExitStatus run(Session &session) override
    {
        CMAdapter &adapter = session.workingCopy();
        const upath &root = adapter.getRootFolder();
        std::vector<NamedPath> paths = lookUp(adapter, paths_->results());
        addOverlooked(adapter, paths);
        refuseUnless(say("Nothing was reverted"), paths,
                     [&](const NamedPath &named)
                     {
                         const std::string reason = explainUntracked(root, named);
                         return reason.empty() ? explainFileInPlace(root, named, paths) : reason;
                     });
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
        const std::size_t count = reverted.files.size() - leftOut.size();
        if (count != 0 || leftOut.empty())
        {
            remark(count == 0 ? say("There is no change to revert.")
                              : say("Reverted %1%.", countFiles(count)));
        }
        return tellLeftOut(count == 0 ? say("Nothing was reverted") : say("Not all were reverted"),
                           root, leftOut);
    }

  private:
    /// Why nothing can be written below a name: a file has that of a folder.
    static std::string explainFileInPlace(const upath &root, const NamedPath &named,
                                          const std::vector<NamedPath> &paths)
    {
        const std::filesystem::path top = nativePath(root);
        std::filesystem::path place = nativePath(named.path).parent_path();
        while (place != top && place.has_relative_path())
        {
            std::error_code ignored;
            const ustring text = makePath(place).string();
            const bool isNamed = std::any_of(paths.begin(), paths.end(),
                                             [&text](const NamedPath &other)
                                             { return liesIn(text, other.path.string()); });
            if (!isNamed && !named.isLink && std::filesystem::is_regular_file(place, ignored))
            {
                return say("%1% is a file now: move it out of the way, or revert it too",
                           showPath(makePath(place)));
            }
            place = place.parent_path();
        }
        return {};
    }

    static void tell(const std::string &wayBack)
    {
        if (!wayBack.empty())
        {
            inform(wayBack);
        }
    }

    /// @throws CancelledOperationException if the person asked to stop while it stored
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
        const OverlookedMarks marks(nativePath(session.adapter().getRootFolder()));
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
            marks.restore();
            throw;
        }
        session.progressLine().end();
        tell(wayBack.files);
        tell(wayBack.staged);
        marks.restore();
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
