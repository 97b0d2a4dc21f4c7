// SPDX-License-Identifier: MIT
#include "main/checkout/obstaclesAhead.hpp"

#include <cstddef>

#include <git2/tree.h>

#include "main/checkout/gitlinks.hpp"

namespace vclink::git
{
namespace
{

/// Returns true if the checkout creates a file or link here.
bool makesFile(const TreeChange &change)
{
    return change.after != nullptr && !isGitlink(change.after);
}

/// Returns true if we have deleted the file that they have changed. libgit2 writes such a file
/// without a notification: it opens whatever is in its place, follows links, and otherwise fails in
/// the middle of its writing.
bool isWrittenUnnoticed(WorkingCopy &copy, const TreeChange &change)
{
    return change.before != nullptr && makesFile(change) && copy.entryOf(change.path) == nullptr;
}

bool isLink(const git_tree_entry *entry)
{
    return git_tree_entry_filemode(entry) == GIT_FILEMODE_LINK;
}

} // namespace

Finding findBlockedWay(WorkingCopy &copy, const TreeChange &change)
{
    const WorkingCopy::Way &way = copy.wayTo(change.path, change.before != nullptr);
    return way.blocker.empty() ? Finding() : inTheWay(way.blocker, way.standing);
}

Finding findSpecialFile(WorkingCopy &copy, const TreeChange &change)
{
    const bool isSpecial = copy.at(change.path) == Standing::Special;
    return isSpecial ? inTheWay(change.path, Standing::Special) : Finding();
}

Finding findIgnoredLink(WorkingCopy &copy, const TreeChange &change)
{
    const bool makesNewFile = change.before == nullptr && makesFile(change) &&
                              git_tree_entry_filemode(change.after) != GIT_FILEMODE_LINK;
    const bool isInTheWay =
        makesNewFile && copy.at(change.path) == Standing::Link && copy.isIgnored(change.path);
    return isInTheWay ? inTheWay(change.path, Standing::Link) : Finding();
}

Finding findFalselyIgnored(WorkingCopy &copy, const TreeChange &change)
{
    if (change.before != nullptr || change.after == nullptr || copy.entryOf(change.path) != nullptr)
    {
        return {};
    }
    const Standing standing = copy.at(change.path);
    const bool isInTheWay = standing != Standing::Nothing && copy.isFalselyIgnored(change.path);
    return isInTheWay ? inTheWay(change.path, standing) : Finding();
}

Finding findForeignInFolder(WorkingCopy &copy, const TreeChange &change)
{
    if (change.before != nullptr || !makesFile(change) ||
        copy.at(change.path) != Standing::Folder || !copy.isFolderInHead(change.path))
    {
        return {};
    }
    const std::string name = copy.foreignBelow(change.path);
    return name.empty() ? Finding() : inChangedFolder(name, copy.at(name));
}

Finding findMissingFolder(WorkingCopy &copy, const TreeChange &change)
{
    const bool isMissing = change.before == nullptr && change.after != nullptr &&
                           copy.at(change.path) == Standing::Nothing &&
                           copy.isFolderInHead(change.path);
    if (!isMissing)
    {
        return {};
    }
    const std::string kind = isGitlink(change.after) ? "submodule" : "file";
    return Obstacle{change.path, "the folder '" + change.path + "', which becomes a " + kind +
                                     ", is missing: bring it back with 'git restore "
                                     "--source=HEAD --staged --worktree' first"};
}

Finding findMissingFileOfOtherKind(WorkingCopy &copy, const TreeChange &change)
{
    const bool isFileOrLink =
        change.before != nullptr && !isGitlink(change.before) && makesFile(change);
    if (!isFileOrLink || isLink(change.before) == isLink(change.after) ||
        copy.at(change.path) != Standing::Nothing)
    {
        return {};
    }
    const std::string name = "'" + change.path + "'";
    const std::string kinds = isLink(change.after)
                                  ? "file " + name + ", which becomes a symbolic link"
                                  : "symbolic link " + name + ", which becomes a file";
    return Obstacle{change.path,
                    "the " + kinds +
                        ", is missing: bring it back with 'git restore "
                        "--ignore-skip-worktree-bits --source=HEAD --staged --worktree' first"};
}

Finding findSubmodule(WorkingCopy &copy, const TreeChange &change)
{
    const bool isReplaced = isGitlink(change.before) && makesFile(change);
    // If ours has made it a folder, nothing of a submodule is left.
    const bool isInTheWay =
        isReplaced && !copy.isFolderInHead(change.path) && copy.holdsFiles(change.path);
    return isInTheWay ? inTheWay(change.path, Standing::Folder) : Finding();
}

Finding findStagedSubmodule(WorkingCopy &copy, const TreeChange &change)
{
    const git_index_entry *const entry = copy.entryOf(change.path);
    const bool isMoved =
        isGitlink(entry) && !isOf(*entry, change.before) && !isOf(*entry, change.after);
    const bool isRemoved = entry == nullptr && isGitlink(change.before) && change.after != nullptr;
    return isMoved || isRemoved ? stagedChangesOf(change.path) : Finding();
}

Finding findFileForSubmodule(WorkingCopy &copy, const TreeChange &change)
{
    if (!isGitlink(change.after) || copy.isInHead(change.path))
    {
        return {};
    }
    const Standing standing = copy.at(change.path);
    const bool isInTheWay = standing != Standing::Nothing && standing != Standing::Folder;
    return isInTheWay ? inTheWay(change.path, standing) : Finding();
}

Finding findFolderOfOtherUse(WorkingCopy &copy, const TreeChange &change)
{
    const bool isReplaced = change.before != nullptr && !isGitlink(change.before);
    const bool isInTheWay = isReplaced && isGitlink(change.after) && copy.holdsFiles(change.path);
    return isInTheWay ? inTheWay(change.path, Standing::Folder) : Finding();
}

Finding findStagedBelowSubmodule(WorkingCopy &copy, const TreeChange &change)
{
    if (!isGitlink(change.after) || change.before != nullptr)
    {
        return {};
    }
    const std::string name = copy.stagedBelow(change.path);
    return name.empty() ? Finding() : stagedChangesOf(name);
}

Finding findStagedDeletion(WorkingCopy &copy, const TreeChange &change)
{
    const bool isDeleted = change.before != nullptr && !isGitlink(change.before) &&
                           copy.entryOf(change.path) == nullptr && copy.hasIndex();
    const bool isLost =
        isDeleted && (change.after != nullptr || copy.at(change.path) != Standing::Nothing);
    return isLost ? stagedChangesOf(change.path) : Finding();
}

Finding findStagedContent(WorkingCopy &copy, const TreeChange &change)
{
    const git_index_entry *const entry = copy.entryOf(change.path);
    if (entry == nullptr || entry->mode == GIT_FILEMODE_COMMIT || isOf(*entry, change.before) ||
        isOf(*entry, change.after))
    {
        return {};
    }
    // The same content in the file is a conflict, which libgit2 finds if the baseline has the old
    // content.
    if (!isGitlink(change.before) && copy.at(change.path) != Standing::Nothing &&
        !copy.isEdited(*entry))
    {
        return {};
    }
    return stagedChangesOf(change.path);
}

Finding findUnwritableFolder(WorkingCopy &copy, const TreeChange &change)
{
    // A file that stays a file is written to.
    const bool isWritten = change.before != nullptr && makesFile(change) &&
                           !isGitlink(change.before) && !isLink(change.before) &&
                           !isLink(change.after);
    if (isWritten)
    {
        return {};
    }
    return findUnwritableFolderOf(copy, change.path);
}

Finding findFolderForDeletedFile(WorkingCopy &copy, const TreeChange &change)
{
    const bool isDeleted =
        change.before != nullptr && !isGitlink(change.before) && change.after == nullptr;
    const bool isInTheWay =
        isDeleted && copy.holdsFiles(change.path) && !copy.isFolderInHead(change.path);
    return isInTheWay ? inTheWay(change.path, Standing::Folder) : Finding();
}

Finding findSubmoduleAfterSibling(WorkingCopy &copy, const TreeChange &change)
{
    const git_index_entry *const entry = copy.entryOf(change.path);
    const bool isSubmodule = isGitlink(change.before) || isGitlink(entry);
    if (!isSubmodule || copy.at(change.path) != Standing::Folder)
    {
        return {};
    }
    const bool isMovedByOurs = isGitlink(entry) && !isOf(*entry, change.before);
    const bool isMergedAlone = isGitlink(change.after) && !isMovedByOurs;
    const bool isInTheWay =
        !isMergedAlone && copy.isInHead(change.path) && copy.hasSiblingBeforeFolder(change.path);
    return isInTheWay ? inTheWay(change.path, Standing::Folder) : Finding();
}

Finding findBlockedWayOfMerge(WorkingCopy &copy, const TreeChange &change)
{
    const WorkingCopy::Way &way = copy.wayTo(change.path);
    const bool mayGo = (way.standing == Standing::Link || way.standing == Standing::File) &&
                       !isWrittenUnnoticed(copy, change);
    if (way.blocker.empty() || (mayGo && copy.isIgnored(way.blocker)))
    {
        return {};
    }
    return inTheWay(way.blocker, way.standing);
}

Finding findUntracked(WorkingCopy &copy, const TreeChange &change)
{
    if (!makesFile(change) || copy.entryOf(change.path) != nullptr)
    {
        return {};
    }
    const Standing standing = copy.at(change.path);
    const bool isOpened = standing == Standing::Special ||
                          (standing != Standing::File && isWrittenUnnoticed(copy, change));
    // libgit2 writes to it as it is, and with it to its other names.
    const bool isHeld = standing == Standing::File && isWrittenUnnoticed(copy, change) &&
                        copy.mustBeRemade(change.path);
    const bool isKeptFolder =
        standing == Standing::Folder &&
        (copy.isFolderInHead(change.path) || (!isOpened && !copy.holdsFiles(change.path)));
    if (standing == Standing::Nothing || isKeptFolder ||
        (!isOpened && !isHeld && copy.isIgnored(change.path)))
    {
        return {};
    }
    return inTheWay(change.path, standing);
}

Finding findUnwritableFolderOfConflict(WorkingCopy &copy, const TreeChange &change)
{
    const git_index_entry *const ours = copy.entryOf(change.path);
    const bool isMerged = ours != nullptr && makesFile(change) && !isOf(*ours, change.before) &&
                          !isOf(*ours, change.after);
    return isMerged ? findUnwritableFolderOf(copy, change.path) : Finding();
}

Finding findOtherCase(WorkingCopy &copy, const TreeChange &change, const git_tree *theirs)
{
    if (change.before != nullptr || !makesFile(change))
    {
        return {};
    }
    const git_index_entry *const ours = copy.entryOf(change.path);
    if (ours == nullptr || change.path == ours->path || findInTree(theirs, ours->path) == nullptr)
    {
        return {};
    }
    return Obstacle{change.path, "the names '" + change.path + "' and '" + ours->path +
                                     "' differ only in case, and 'core.ignorecase' is set: merge "
                                     "with 'git merge'"};
}

Finding findUntrackedOfHead(WorkingCopy &copy, const TreeChange &change)
{
    const bool isDeleted = change.before != nullptr && change.after == nullptr &&
                           copy.entryOf(change.path) == nullptr && copy.isInHead(change.path);
    const Standing standing = isDeleted ? copy.at(change.path) : Standing::Nothing;
    const bool isInTheWay = standing != Standing::Nothing && standing != Standing::Folder;
    return isInTheWay ? inTheWay(change.path, standing) : Finding();
}

Finding findYielding(WorkingCopy &copy, const TreeChange &change)
{
    if (change.before != nullptr || !makesFile(change) || copy.entryOf(change.path) != nullptr)
    {
        return {};
    }
    const Finding above = findBlockedWay(copy, change);
    const Standing standing = above ? Standing::Nothing : copy.at(change.path);
    const bool isRemoved = standing == Standing::Link ||
                           (standing == Standing::File && copy.mustBeRemade(change.path));
    return isRemoved ? inTheWay(change.path, standing) : above;
}

bool isDeletedByBoth(WorkingCopy &copy, const TreeChange &change)
{
    return change.before != nullptr && !isGitlink(change.before) && change.after == nullptr &&
           copy.entryOf(change.path) == nullptr;
}

Finding findUnmerged(const WorkingCopy &copy)
{
    const std::size_t count = git_index_entrycount(copy.index());
    for (std::size_t i = 0; i < count; ++i)
    {
        const git_index_entry *const entry = git_index_get_byindex(copy.index(), i);
        if (GIT_INDEX_ENTRY_STAGE(entry) != GIT_INDEX_STAGE_NORMAL)
        {
            const std::string name = entry->path;
            return Obstacle{name, "'" + name + "' is in conflict: resolve it before the merge"};
        }
    }
    return {};
}

Finding findHiddenEdit(WorkingCopy &copy)
{
    if (!copy.hasHidden())
    {
        return {};
    }
    const std::size_t count = git_index_entrycount(copy.index());
    for (std::size_t i = 0; i < count; ++i)
    {
        const git_index_entry *const entry = git_index_get_byindex(copy.index(), i);
        if (isHidden(*entry) && copy.isEdited(*entry))
        {
            return hiddenEdit(*entry);
        }
    }
    return {};
}

Obstacle hiddenEdit(const git_index_entry &entry)
{
    const bool isSparse = (entry.flags_extended & GIT_INDEX_ENTRY_SKIP_WORKTREE) != 0;
    const std::string option = isSparse ? "skip-worktree" : "assume-unchanged";
    const std::string name = entry.path;
    return {name, "the changes of '" + name + "' would be lost in the merge. Git hides them, " +
                      "because the file is marked " + option + ": take the mark away with " +
                      "'git update-index --no-" + option + "' and commit, or remove the file"};
}

Finding findUnwritableFolderOf(WorkingCopy &copy, const std::string &name)
{
    const std::string &folder = copy.unwritableFolderOf(name);
    return folder.empty() ? Finding()
                          : Obstacle{name, "the folder '" + folder + "' cannot be written to"};
}

} // namespace vclink::git
