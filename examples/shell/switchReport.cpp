// SPDX-License-Identifier: MIT
#include "switchReport.hpp"

#include <cstddef>

#include "failures.hpp"
#include "fl/i18n/convert.hpp"
#include "namedPaths.hpp"
#include "names.hpp"
#include "revisions.hpp"
#include "states.hpp"
#include "texts.hpp"
#include "unfinished.hpp"
#include "workingCopy.hpp"

namespace vclink::shell
{
namespace
{

/// Whether a branch has something under a name, or a file under the name of a folder in it.
bool isTaken(const git::BranchManager &manager, const std::string &branch, const std::string &name)
{
    if (findRevision(manager, branch + ':' + name))
    {
        return true;
    }
    for (std::size_t slash = name.find('/'); slash != std::string::npos;
         slash = name.find('/', slash + 1))
    {
        const auto folder = findRevision(manager, branch + ':' + name.substr(0, slash));
        if (!folder)
        {
            return false;
        }
        if (!findRevision(manager, *folder + "^{tree}"))
        {
            return true;
        }
    }
    return false;
}

} // namespace

void refuseForObstacles(CMAdapter &adapter, const git::BranchManager &manager,
                        const std::string &branch)
{
    const std::string unfinished = describeUnfinished(adapter);
    if (!unfinished.empty())
    {
        throw ShellFailure(say("Nothing was switched. %1%", unfinished));
    }
    FileStateMap changed;
    FileStateMap untracked;
    for (const auto &entry : wholeStates(adapter))
    {
        const FileState::State state = entry.second.getState();
        const std::string name =
            fl::i18n::ustring_to_utf8(relativeName(entry.first, adapter.getRootFolder()));
        const std::string there = "refs/heads/" + branch;
        if (state == FileState::Unversioned && isTaken(manager, there, name))
        {
            untracked.insert(entry);
        }
        else if (isChanged(state) &&
                 findRevision(manager, "HEAD:" + name) != findRevision(manager, there + ':' + name))
        {
            changed.insert(entry);
        }
    }
    std::string reasons;
    if (!changed.empty())
    {
        reasons += say("These files have uncommitted changes, and differ on that branch:%1%",
                       listNames(changed)) +
                   '\n';
    }
    if (!untracked.empty())
    {
        reasons += say("These files are not tracked, and that branch has something in their "
                       "place:%1%",
                       listNames(untracked)) +
                   '\n';
    }
    if (!reasons.empty())
    {
        throw ShellFailure(reasons +
                           say("Nothing was switched. Commit the changes or revert them, move "
                               "untracked files out of the way, and\nswitch again."));
    }
}

} // namespace vclink::shell
