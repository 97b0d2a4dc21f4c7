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
#include "links.hpp"
#include "namedPaths.hpp"
#include "names.hpp"
#include "refusals.hpp"
#include "runStoppable.hpp"
#include "states.hpp"

namespace vclink::shell
{
namespace
{

class ResolvedCommand : public Command
{
  public:
    void declare(CLI::App &line) override
    {
        path_ = declarePaths(line, "A file, or a folder: all files in conflict below it")
                    ->required()
                    ->expected(1);
        line.footer("Takes the file as it now stands for the solution of its conflict; where it is "
                    "gone from the\n"
                    "disk, that is the solution. Its text is not looked at. A file that is in no "
                    "conflict is staged\n"
                    "as it stands. Symbolic links are refused.");
    }

    ExitStatus run(Session &session) override
    {
        CMAdapter &adapter = session.adapter();
        const upath &root = adapter.getRootFolder();
        const NamedPath named = lookUp(adapter, path_->results()).front();
        const FileStateMap conflicts = filter(named.states, isInConflict);
        const std::vector<upath> files =
            named.isFolder ? solutions(conflicts, root) : std::vector<upath>{named.path};
        refuseUnless("Nothing was marked as resolved", {named},
                     [&](const NamedPath &path) { return explain(root, path, conflicts, files); });
        refuseStrays("Nothing was marked as resolved", adapter, {named}, files,
                     [](FileState::State state) { return state != FileState::Clean; });
        const ExitStatus status = runStoppable(session,
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
                   ? "It was in no conflict, and is staged as it stands."
                   : "Marked " + countFiles(conflicts.size() - leftOut.size()) + " as resolved.");
        return tellLeftOut("Not all were marked as resolved", root, leftOut);
    }

  private:
    static bool isLink(const upath &path)
    {
        std::error_code ignored;
        return std::filesystem::is_symlink(nativePath(path), ignored);
    }

    /// The back end takes a link that leads nowhere for a file that is gone.
    static std::vector<upath> solutions(const FileStateMap &conflicts, const upath &root)
    {
        std::vector<upath> files = addressable(filterFollowed(conflicts, root, false), root);
        files.erase(std::remove_if(files.begin(), files.end(), isLink), files.end());
        return files;
    }

    static std::string explain(const upath &root, const NamedPath &named,
                               const FileStateMap &conflicts, const std::vector<upath> &files)
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
            return "it is a symbolic link that leads nowhere, and would be removed: use \"git "
                   "add\"";
        }
        if (named.isFolder && conflicts.empty())
        {
            return "no file in it is in conflict";
        }
        const bool areLinks = files.empty() && !addressable(conflicts, root).empty();
        return areLinks ? "only symbolic links are in conflict in it: use \"git add\"" : "";
    }

    const CLI::Option *path_ = nullptr;
};

} // namespace

std::unique_ptr<Command> makeResolvedCommand()
{
    return std::make_unique<ResolvedCommand>();
}

} // namespace vclink::shell
