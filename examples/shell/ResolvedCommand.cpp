// SPDX-License-Identifier: MIT
#include <algorithm>
#include <filesystem>
#include <string>
#include <system_error>
#include <vector>

#include <CLI/CLI.hpp>

#include "Output.hpp"
#include "Session.hpp"
#include "arguments.hpp"
#include "commands.hpp"
#include "failures.hpp"
#include "fl/i18n/convert.hpp"
#include "links.hpp"
#include "mergeLeftovers.hpp"
#include "namedPaths.hpp"
#include "names.hpp"
#include "refusals.hpp"
#include "renames.hpp"
#include "runStoppable.hpp"
#include "states.hpp"
#include "texts.hpp"

namespace vclink::shell
{
namespace
{

class ResolvedCommand : public Command
{
  public:
    void declare(CLI::App &line) override
    {
        paths_ = declarePaths(line, say("Files, and folders: all files in conflict below them"))
                     ->required();
        line.footer(say("The file as it is now becomes the solution of its conflict. If it is gone "
                        "from the disk, the solution\nis to delete it. The text is not checked for "
                        "conflict markers. A file that is not in conflict is\nstaged as it is."));
    }

    ExitStatus run(Session &session) override
    {
        CMAdapter &adapter = session.workingCopy();
        const upath &root = adapter.getRootFolder();
        const std::vector<NamedPath> paths = lookUp(adapter, paths_->results());
        refuseUnless(say("Nothing was marked as resolved"), paths,
                     [&](const NamedPath &named) { return explain(root, named); });
        FileStateMap conflicts;
        std::vector<upath> files;
        for (const NamedPath &named : paths)
        {
            FileStateMap inConflict = filter(named.states, isInConflict);
            const std::vector<upath> chosen = solutions(root, named, inConflict);
            files.insert(files.end(), chosen.begin(), chosen.end());
            conflicts.merge(inConflict);
        }
        refuseStrays(say("Nothing was marked as resolved"), adapter, paths, files,
                     [](FileState::State state) { return state != FileState::Clean; });
        refuseUntracked(adapter, files);
        const ExitStatus status = runStoppable(session, Stops::Never,
                                               [&]
                                               {
                                                   for (const upath &file : files)
                                                   {
                                                       adapter.markResolved(file);
                                                   }
                                               });
        if (status != Done)
        {
            return status;
        }
        const FileStateMap leftOut = findLeftOut(adapter, conflicts, isInConflict);
        remark(conflicts.empty()
                   ? say("It was not in conflict, and is staged as it is.")
                   : say("Marked %1% as resolved.", countFiles(conflicts.size() - leftOut.size())));
        tellSetAside(adapter);
        return tellLeftOut(say("Not all were marked as resolved"), root, leftOut);
    }

  private:
    static bool isLink(const upath &path)
    {
        std::error_code ignored;
        return std::filesystem::is_symlink(nativePath(path), ignored);
    }

    /// The back end takes a link that leads nowhere for a file that is gone.
    static std::vector<upath> solutions(const upath &root, const NamedPath &named,
                                        const FileStateMap &conflicts)
    {
        if (!named.isFolder)
        {
            return {named.path};
        }
        std::vector<upath> files = addressable(filterFollowed(conflicts, root, false), root);
        files.erase(std::remove_if(files.begin(), files.end(), isLink), files.end());
        return files;
    }

    /// The back end adds everything in a folder that is in the place of a file in conflict.
    /// @throws ShellFailure if there are such files that git does not track
    static void refuseUntracked(CMAdapter &adapter, const std::vector<upath> &files)
    {
        for (const upath &file : files)
        {
            std::error_code ignored;
            if (!std::filesystem::is_directory(nativePath(file), ignored))
            {
                continue;
            }
            FileStateMap untracked = filter(folderStates(adapter, file), [](FileState::State state)
                                            { return !isTracked(state); });
            // A submodule is one entry.
            untracked.erase(file);
            untracked.erase(upath(file.string() + u'/'));
            if (!untracked.empty())
            {
                const ustring name = wayTo(file, makePath(currentFolder()).string());
                throw ShellFailure(say(
                    "Nothing was marked as resolved: a folder is in the place of %1%, and these "
                    "files in it are not tracked:%2%\nAdd them first if they belong to the "
                    "solution. Otherwise run this, which leaves the folder as it is:\ngit "
                    "update-index --force-remove %3%",
                    quoteName(name), listNames(untracked),
                    quoteForShell(fl::i18n::ustring_to_utf8(name))));
            }
        }
    }

    static std::string explain(const upath &root, const NamedPath &named)
    {
        if (named.states.empty())
        {
            return explainAbsence(root, named);
        }
        if (named.isLink)
        {
            return explainLink(named, "git add");
        }
        if (isLink(named.path))
        {
            return say(
                "it is a symbolic link that leads nowhere, and would be removed: use \"%1%\"",
                "git add");
        }
        const FileStateMap conflicts = filter(named.states, isInConflict);
        if (named.isFolder && conflicts.empty())
        {
            return say("no file in it is in conflict");
        }
        const bool areLinks =
            solutions(root, named, conflicts).empty() && !addressable(conflicts, root).empty();
        return areLinks ? say("only symbolic links are in conflict in it: use \"%1%\"", "git add")
                        : "";
    }

    const CLI::Option *paths_ = nullptr;
};

} // namespace

std::unique_ptr<Command> makeResolvedCommand()
{
    return std::make_unique<ResolvedCommand>();
}

} // namespace vclink::shell
