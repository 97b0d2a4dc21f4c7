// SPDX-License-Identifier: MIT
#include "main/checkout/overlookedEdits.hpp"

#include <cstdint>
#include <string>

#include <sys/stat.h>

#include "main/checkout/gitlinks.hpp"
#include "util/repository/entryStatus.hpp"

namespace vclink::git
{
namespace
{

/// All that libgit2's checkout compares before it compares the content.
bool hasSizeAndTimeOf(const git_index_entry &entry, const struct stat &status)
{
    return entry.file_size == static_cast<std::uint32_t>(status.st_size) &&
           isSameTime(entry.mtime, status.st_mtim);
}

/// git takes such a file for changed without reading it. An entry without a size has to be
/// compared.
bool hasOtherSizeThan(const git_index_entry &entry, const struct stat &status)
{
    return entry.file_size != 0 && entry.file_size != static_cast<std::uint32_t>(status.st_size);
}

bool hasInodeOf(const git_index_entry &entry, const struct stat &status)
{
    return entry.ino == static_cast<std::uint32_t>(status.st_ino) &&
           isSameTime(entry.ctime, status.st_ctim);
}

bool isOfKindOf(const git_index_entry &entry, const struct stat &status)
{
    return (entry.mode & S_IFMT) == (status.st_mode & S_IFMT);
}

/// Returns the obstacle if the file is edited, or may be because it cannot be read.
Finding judgeChangedFile(WorkingCopy &copy, const std::string &name)
{
    const git_index_entry *const entry = copy.entryOf(name);
    const struct stat &status = copy.statusOf(name);
    // libgit2 compares the kind without reading the file.
    if (entry == nullptr || !isOfKindOf(*entry, status))
    {
        return {};
    }
    if (S_ISREG(status.st_mode) && !copy.isReadable(name))
    {
        return unreadableFile(name);
    }
    return copy.isEdited(*entry) ? editBeforeMerge(name) : Finding();
}

} // namespace

Finding findOverlookedEdit(WorkingCopy &copy, const TreeChange &change)
{
    const git_index_entry *const entry = copy.entryOf(change.path);
    if (entry == nullptr || isGitlink(entry))
    {
        return {};
    }
    const struct stat &status = copy.statusOf(change.path);
    const bool isAsLibGit2Sees = hasSizeAndTimeOf(*entry, status);
    if (isAsLibGit2Sees && hasInodeOf(*entry, status))
    {
        return {};
    }
    if (S_ISDIR(status.st_mode) && copy.holdsFiles(change.path) &&
        copy.isIgnoredByLibGit2(change.path))
    {
        return inTheWay(change.path, Standing::Folder);
    }
    if (S_ISREG(status.st_mode) && !copy.isReadable(change.path))
    {
        return unreadableFile(change.path);
    }
    const bool isOfSameKind = isOfKindOf(*entry, status);
    const bool isEditOfSameSize = isAsLibGit2Sees && isOfSameKind &&
                                  !copy.isConvertedByGit(change.path) && copy.isEdited(*entry);
    // libgit2 finds this, too, except if its own hash fails: it does for a file of more than 4 GiB,
    // and can for one that grows, or without memory or descriptors.
    const bool isEdit = !isAsLibGit2Sees && isOfSameKind && copy.isOfNeither(change);
    const bool isHiddenEdit = !isEdit && S_ISREG(status.st_mode) && isOfSameKind &&
                              hasOtherSizeThan(*entry, status) &&
                              copy.isEditHiddenByConversion(*entry, change.after);
    if (isEditOfSameSize || isEdit || isHiddenEdit)
    {
        return Obstacle{change.path, "the uncommitted changes of '" + change.path +
                                         "' would be lost in the checkout"};
    }
    return {};
}

Finding findEditBeforeMerge(WorkingCopy &copy, const ChangedFiles &changed)
{
    for (const ChangedFile &file : changed.files())
    {
        if (Finding found = judgeChangedFile(copy, file.path))
        {
            return found;
        }
    }
    return {};
}

Finding findStagedThoughIgnored(WorkingCopy &copy, const TreeChange &change)
{
    if (change.before != nullptr || change.after == nullptr)
    {
        return {};
    }
    const Standing standing = copy.at(change.path);
    const git_index_entry *const entry = copy.entryOf(change.path);
    const bool isStaged =
        entry != nullptr && (!isOf(*entry, change.after) || copy.isEdited(*entry));
    const bool isLost = standing == Standing::Folder ? !copy.stagedBelow(change.path).empty()
                                                     : standing != Standing::Nothing && isStaged;
    if (!isLost || !copy.isIgnoredByLibGit2(change.path))
    {
        return {};
    }
    return stagedChangesOf(change.path);
}

} // namespace vclink::git
