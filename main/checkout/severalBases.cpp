// SPDX-License-Identifier: MIT
#include "main/checkout/severalBases.hpp"

#include <algorithm>
#include <string>

#include <git2/tree.h>

#include "main/checkout/conflictLocks.hpp"
#include "main/checkout/treeChanges.hpp"

namespace vclink::git
{
namespace
{

using Bases = std::vector<OwnedHandle<git_tree>>;

/// Returns true if all bases have the file as this side has it. Then only the other side has
/// changed it, which is no conflict.
bool isInAll(const Bases &bases, const std::string &path, const git_tree_entry *file)
{
    return std::all_of(
        bases.begin(), bases.end(),
        [&](const OwnedHandle<git_tree> &base)
        {
            const OwnedTreeEntry entry = findInTree(base.get(), path);
            return entry != nullptr && file != nullptr &&
                   isSameId(*git_tree_entry_id(entry.get()), *git_tree_entry_id(file)) &&
                   git_tree_entry_filemode(entry.get()) == git_tree_entry_filemode(file);
        });
}

/// @param change from our side to theirs
Finding findLinkAndFolder(const WorkingCopy &copy, const TreeChange &change, const git_tree *theirs)
{
    const git_tree_entry *const link = change.before != nullptr ? change.before : change.after;
    const git_tree *const other = change.before != nullptr ? theirs : copy.head();
    const bool isOneSided = change.before == nullptr || change.after == nullptr;
    if (!isOneSided || git_tree_entry_filemode(link) != GIT_FILEMODE_LINK ||
        !isFolderIn(other, change.path))
    {
        return {};
    }
    return Obstacle{change.path, "'" + change.path +
                                     "' is a link of one side and a folder of the other, and there "
                                     "are several merge bases: merge with 'git merge'"};
}

} // namespace

Finding findBetweenSides(git_repository *repository, WorkingCopy &copy,
                         const std::vector<OwnedHandle<git_tree>> &bases, const git_tree *theirs)
{
    Finding found;
    visitTreeChanges(repository, copy.head(), theirs,
                     [&](const TreeChange &change)
                     {
                         found = findLockBesideFile(copy, change, theirs);
                         if (!found)
                         {
                             found = findLinkAndFolder(copy, change, theirs);
                         }
                         const bool isClean =
                             found && (isInAll(bases, change.path, change.before) ||
                                       isInAll(bases, change.path, change.after));
                         if (isClean)
                         {
                             found.reset();
                         }
                         return !found;
                     });
    return found;
}

} // namespace vclink::git
