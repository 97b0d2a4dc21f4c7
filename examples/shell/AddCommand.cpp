// SPDX-License-Identifier: MIT
#include <algorithm>
#include <filesystem>
#include <system_error>
#include <vector>

#include <CLI/CLI.hpp>

#include "Output.hpp"
#include "Session.hpp"
#include "arguments.hpp"
#include "commands.hpp"
#include "failures.hpp"
#include "foundation/core/except/IUserException.hpp"
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
        line.footer(say("The files are in the next commit. Ignored files in a folder are left out; "
                        "an ignored file that is\nnamed itself is refused. A file that Git tracks "
                        "already is refused too: commit takes its changes\nanyway."));
    }

    ExitStatus run(Session &session) override
    {
        CMAdapter &adapter = session.workingCopy();
        const upath &root = adapter.getRootFolder();
        const std::vector<NamedPath> paths =
            lookUp(adapter, addsAll_ ? std::vector<std::string>{nativePath(root).string()}
                                     : paths_->results());
        if (!addsAll_)
        {
            refuseUnless(say("Nothing was added"), paths,
                         [&root](const NamedPath &named) { return explain(root, named); });
        }
        FileStateMap files;
        FileStateMap removed;
        for (const NamedPath &named : paths)
        {
            FileStateMap chosen = named.isFolder ? filter(named.states, isNew) : named.states;
            FileStateMap back = filterBack(root, named.states);
            for (const auto &entry : back)
            {
                chosen.erase(entry.first);
            }
            files.merge(chosen);
            removed.merge(back);
        }
        const std::vector<upath> list = addable(files, root);
        refuseStrays(say("Nothing was added"), adapter, paths, list,
                     [](FileState::State state) { return isNew(state) || isInConflict(state); });
        const ExitStatus status = runStoppable(session, Stops::Never,
                                               [&]
                                               {
                                                   addNew(adapter, list);
                                                   for (const auto &entry : removed)
                                                   {
                                                       adapter.markResolved(entry.first);
                                                   }
                                               });
        if (status != Done)
        {
            return status;
        }
        files.merge(removed);
        const FileStateMap leftOut = findLeftOut(adapter, files, isNew);
        const std::size_t count = files.size() - leftOut.size();
        if (count != 0 || leftOut.empty())
        {
            remark(count == 0 ? say("There is no new file to add.")
                              : say("Added %1%.", countFiles(count)));
        }
        return tellLeftOut(count == 0 ? say("Nothing was added") : say("Others were not added"),
                           root, leftOut);
    }

  private:
    static bool isNew(FileState::State state)
    {
        return state == FileState::Unversioned;
    }

    static std::vector<upath> addable(const FileStateMap &files, const upath &root)
    {
        std::vector<upath> list = addressable(filterFollowed(files, root, false), root);
        list.erase(std::remove_if(list.begin(), list.end(), isRepository), list.end());
        return list;
    }

    /// The back end also names tracked files below a folder in whose place a new file is.
    static void addNew(CMAdapter &adapter, const std::vector<upath> &files)
    {
        try
        {
            adapter.addFiles(literalNames(files, adapter.getRootFolder()));
        }
        catch (const foundation::core::except::IUserException &failure)
        {
            if (failure.GetID().find("AlreadyAdded") == std::string::npos)
            {
                throw;
            }
            reportFailure();
            throw ShellFailure(say("Nothing can be added in their place before you commit. git can "
                                   "do it: use \"git add\"."));
        }
    }

    static std::string explain(const upath &root, const NamedPath &named)
    {
        if (named.states.empty())
        {
            return explainAbsence(root, named);
        }
        if (named.states.size() == 1 && isRepository(named.states.begin()->first))
        {
            return say("it is a repository of its own: use \"%1%\"", "git submodule add");
        }
        std::string reason = explainLink(named, "git add");
        const auto own = named.states.find(named.path);
        if (!reason.empty() || named.isFolder || own == named.states.end())
        {
            return reason;
        }
        std::error_code ignored;
        const bool isThere = std::filesystem::exists(
            std::filesystem::symlink_status(nativePath(named.path), ignored));
        switch (own->second.getState())
        {
        case FileState::InConflict:
            return say("it is in conflict: edit it until it is right, then mark it with "
                       "\"vclink-shell resolved\"");
        case FileState::Missing:
        case FileState::Deleted:
            return isThere ? reason : say("it is gone from the disk, and from the next commit");
        case FileState::Unversioned:
            return reason;
        default:
            return say("Git tracks it already: its changes are in the next commit anyway");
        }
    }

    /// Files that are removed in the index, but on the disk. To the back end they are not new: it
    /// stages them as the solution of a conflict.
    static FileStateMap filterBack(const upath &root, const FileStateMap &states)
    {
        FileStateMap back;
        for (const auto &entry : states)
        {
            std::error_code ignored;
            const auto status = std::filesystem::symlink_status(nativePath(entry.first), ignored);
            if (entry.second.getState() == FileState::Deleted &&
                std::filesystem::is_regular_file(status) && isAddressable(entry.first, root) &&
                !isPattern(relativeName(entry.first, root)) && !isFollowed(entry.first, root))
            {
                back.insert(back.end(), entry);
            }
        }
        return back;
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
