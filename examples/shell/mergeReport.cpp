// SPDX-License-Identifier: MIT
#include "mergeReport.hpp"

#include <cstdlib>
#include <filesystem>
#include <sstream>
#include <string>
#include <system_error>

#include <unistd.h>

#include "failures.hpp"
#include "mergeLeftovers.hpp"
#include "mergeObstacles.hpp"
#include "namedPaths.hpp"
#include "states.hpp"
#include "texts.hpp"
#include "unfinished.hpp"
#include "wayOut.hpp"
#include "workingCopy.hpp"

namespace vclink::shell
{
namespace
{

// GIT_ECONFLICT, GIT_ELOCKED.
constexpr int wouldLoseWork = -13;
constexpr int isLocked = -14;

/// The first word of a command, without the quotes around it.
std::string firstWord(const std::string &command)
{
    const std::size_t begin = command.find_first_not_of(' ');
    if (begin == std::string::npos)
    {
        return {};
    }
    const bool isQuoted = command[begin] == '"';
    const std::size_t start = begin + (isQuoted ? 1 : 0);
    return command.substr(start, command.find(isQuoted ? '"' : ' ', start) - start);
}

bool isProgram(const std::filesystem::path &path)
{
    std::error_code ignored;
    return std::filesystem::is_regular_file(path, ignored) && ::access(path.c_str(), X_OK) == 0;
}

bool canBeStarted(const std::string &word)
{
    if (word.find('/') != std::string::npos)
    {
        return isProgram(word);
    }
    const char *const path = std::getenv("PATH");
    std::istringstream folders(path == nullptr ? "" : path);
    for (std::string folder; std::getline(folders, folder, ':');)
    {
        if (!word.empty() && isProgram(std::filesystem::path(folder.empty() ? "." : folder) / word))
        {
            return true;
        }
    }
    return false;
}

void tellObstacles(const MergeObstacles &obstacles)
{
    if (!obstacles.changed.empty())
    {
        complain(say("These files have uncommitted changes:%1%", listNames(obstacles.changed)));
    }
    if (!obstacles.untracked.empty())
    {
        complain(say("These files are not tracked, and the other side has something in their "
                     "place:%1%",
                     listNames(obstacles.untracked)));
    }
    if (!obstacles.missingSubmodules.empty())
    {
        complain(say("The folders of these submodules are missing:%1%\nRestore them with \"git "
                     "submodule update --init\" first. A commit would leave these submodules out.",
                     listNames(obstacles.missingSubmodules)));
    }
}

/// In a partial clone. Nothing in the working copy is in the way then.
bool lacksContent(const MergeNotes &notes)
{
    return notes.failure == wouldLoseWork &&
           notes.text.find("is not in this partial clone") != std::string::npos;
}

} // namespace

void tellConflicts(CMAdapter &adapter, const MergeNotes &notes)
{
    const FileStateMap conflicts = filter(wholeStates(adapter), isInConflict);
    if (conflicts.empty())
    {
        complain(say("No file is in conflict. Conclude the merge with \"vclink-shell commit\"."));
        return;
    }
    complain(
        say("These files are in conflict:%1%\nEdit each until it is right, and mark it with "
            "\"vclink-shell resolved\". Then conclude the merge\nwith \"vclink-shell commit\", "
            "or undo it with \"git merge --abort\".",
            listNames(conflicts)));
    const FileStateMap refused = findRefused(adapter, conflicts, notes);
    if (!refused.empty())
    {
        complain(say("A merge command refused these files. They may be a mix of both sides without "
                     "conflict markers:%1%",
                     listNames(refused)));
    }
    tellSetAside(adapter);
}

void tellRefusal(CMAdapter &adapter, const MergeNotes &notes,
                 const std::optional<std::string> &theirs)
{
    const std::string word = firstWord(notes.command);
    if (lacksContent(notes))
    {
        complain(say("Nothing was merged. Use \"git merge\" for this, which downloads what is "
                     "missing."));
    }
    else if (notes.failure == wouldLoseWork)
    {
        tellObstacles(findMergeObstacles(adapter, theirs));
        complain(say("Nothing was merged. Commit the changes that would be lost, or move the files "
                     "out of the way, and\nmerge again."));
    }
    else if (notes.failure == isLocked || namesLock(adapter, notes.text))
    {
        tellLocks(adapter, notes.text);
    }
    else if (!notes.driver.empty() && !canBeStarted(word))
    {
        complain(say("The merge command can't be started: '%1%' is no program. Correct the setting "
                     "merge.%2%.driver: %3%",
                     word, notes.driver, notes.command));
        const FileStateMap files =
            withDriver(adapter, findChangedByBoth(adapter, theirs), notes.driver);
        if (!files.empty())
        {
            complain(say("It merges these files:%1%", listNames(files)));
        }
    }
}

void tellUnfinished(CMAdapter &adapter)
{
    const std::string text = describeUnfinished(adapter);
    if (!text.empty())
    {
        complain(text);
    }
}

} // namespace vclink::shell
