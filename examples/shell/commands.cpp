// SPDX-License-Identifier: MIT
#include "commands.hpp"

namespace vclink::shell
{

Command::~Command() = default;

const std::vector<CommandEntry> &commandTable()
{
    static const std::vector<CommandEntry> table{
        {"status", "Show the state of files that are not clean", makeStatusCommand},
        {"add", "Start tracking new files: they are in the next commit", makeAddCommand},
        {"rm", "Stop tracking files; they stay on disk", makeRemoveCommand},
        {"resolved", "Mark files in conflict as resolved", makeResolvedCommand},
        {"commit", "Commit all changes to tracked files", makeCommitCommand},
        {"revert", "Discard all changes to files", makeRevertCommand},
        {"branches", "Show the names of branches", makeBranchesCommand},
        {"branch", "Make or delete a branch", makeBranchCommand},
        {"switch", "Make another branch the current one, and write its files", makeSwitchCommand},
        {"current", "Show the name of the current branch", makeCurrentCommand},
        {"rev", "Show the id of a revision", makeRevisionCommand},
        {"state", "Show whether a merge or another operation is unfinished", makeStateCommand},
        {"merge", "Merge a branch into the current one", makeMergeCommand},
        {"clone", "Copy a repository into a new working copy", makeCloneCommand},
        {"fetch", "Download a remote's branches", makeFetchCommand},
        {"push", "Upload commits to a remote, and move its branches", makePushCommand},
        {"heads", "Show the references of a remote", makeHeadsCommand},
        {"attr", "Show Git's attributes of a file", makeAttributesCommand},
        {"config", "Show or install the merge and diff tools in Git's configuration",
         makeConfigCommand},
        {"probe", "Show whether a folder is a working copy or repository that can be served",
         makeProbeCommand},
        {"version", "Show the versions of this program and of libgit2", makeVersionCommand}};
    return table;
}

} // namespace vclink::shell
