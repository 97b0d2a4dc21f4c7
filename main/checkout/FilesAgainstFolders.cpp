// SPDX-License-Identifier: MIT
#include "main/checkout/FilesAgainstFolders.hpp"

#include <algorithm>
#include <cstddef>
#include <iterator>
#include <limits>
#include <memory>

#include <git2/diff.h>
#include <git2/tree.h>

#include "error/errorUtil/GitResult.hpp"
#include "main/checkout/gitlinks.hpp"
#include "main/checkout/siblingNames.hpp"
#include "util/path/foldersAbove.hpp"
#include "util/repository/repository.hpp"

namespace vclink::git
{
namespace
{

using Diff = std::unique_ptr<git_diff, void (*)(git_diff *)>;
using Paths = std::set<std::string>;

template <class Condition> Paths those(const Paths &paths, Condition condition)
{
    Paths result;
    std::copy_if(paths.begin(), paths.end(), std::inserter(result, result.end()), condition);
    return result;
}

Paths joined(Paths left, Paths right)
{
    left.merge(right);
    return left;
}

Diff compare(git_repository *repository, git_tree *before, git_tree *after)
{
    git_diff *raw = nullptr;
    const GitResult<void> compared =
        call(git_diff_tree_to_tree, &raw, repository, before, after, nullptr);
    Diff diff(raw, git_diff_free);
    check(compared);
    return diff;
}

/// Marks what a merge can take for a rename. A merge requires a similarity of 50 %. This search
/// requires less, because its similarities can differ from those of the merge.
void findRenames(git_diff *diff)
{
    git_diff_find_options options{};
    check(git_diff_find_options_init, &options, unsigned{GIT_DIFF_FIND_OPTIONS_VERSION});
    options.flags = GIT_DIFF_FIND_RENAMES;
    options.rename_threshold = 40;
    options.rename_limit = std::numeric_limits<unsigned short>::max();
    check(git_diff_find_similar, diff, &options);
}

/// Returns true if both trees have this file or folder, with the same content.
bool isSame(const git_tree *left, const git_tree *right, const std::string &path)
{
    const OwnedTreeEntry leftEntry = findInTree(left, path);
    const OwnedTreeEntry rightEntry = findInTree(right, path);
    return leftEntry != nullptr && rightEntry != nullptr &&
           isSameId(*git_tree_entry_id(leftEntry.get()), *git_tree_entry_id(rightEntry.get()));
}

/// Returns a folder of a tree, null if it has none of this name.
OwnedHandle<git_tree> folderIn(git_repository *repository, const git_tree *tree,
                               const std::string &path)
{
    const OwnedTreeEntry entry = findInTree(tree, path);
    return entry != nullptr && git_tree_entry_type(entry.get()) == GIT_OBJECT_TREE
               ? lookupTree(repository, git_tree_entry_id(entry.get()))
               : nullptr;
}

/// Returns true if libgit2 does not see that a changed folder became a file on the other side: it
/// compares the file only with the next name in its list, and that file must be new or changed.
bool isOverlooked(git_repository *repository, const git_tree *before, const git_tree *side,
                  const std::string &path)
{
    const OwnedHandle<git_tree> folderBefore = folderIn(repository, before, path);
    const OwnedHandle<git_tree> folder = folderIn(repository, side, path);
    std::string first;
    visitTreeChanges(repository, nullptr, folderBefore.get(),
                     [&first](const TreeChange &file)
                     {
                         first = file.path;
                         return false;
                     });
    bool isNext = true;
    bool isWritten = false;
    visitTreeChanges(repository, folderBefore.get(), folder.get(),
                     [&](const TreeChange &change)
                     {
                         isWritten = change.after != nullptr;
                         isNext = isNext && isWritten && change.path <= first;
                         return !isWritten;
                     });
    return isWritten && !isNext;
}

Finding findOverlooked(git_repository *repository, const git_tree *before, const git_tree *side,
                       const Paths &folders)
{
    for (const std::string &path : folders)
    {
        if (isOverlooked(repository, before, side, path))
        {
            return Obstacle{path, "'" + path +
                                      "' is a file of one side and a changed folder of the other: "
                                      "merge with 'git merge'"};
        }
    }
    return {};
}

bool isBelow(const Paths &folders, const std::string &path)
{
    return anyFolderAbove(path, [&folders](const std::string &above)
                          { return folders.count(above) != 0; });
}

Finding findRenameTo(git_repository *repository, git_tree *before, git_tree *after,
                     const Paths &files, const Paths &folders)
{
    if (files.empty() && folders.empty())
    {
        return {};
    }
    const Diff diff = compare(repository, before, after);
    findRenames(diff.get());
    const std::size_t count = git_diff_num_deltas(diff.get());
    for (std::size_t i = 0; i < count; ++i)
    {
        const git_diff_delta *const delta = git_diff_get_delta(diff.get(), i);
        if (delta == nullptr || delta->status != GIT_DELTA_RENAMED)
        {
            continue;
        }
        const std::string name = delta->new_file.path;
        if (files.count(name) != 0)
        {
            return Obstacle{name, "'" + name +
                                      "' is a renamed file of one side and a folder of the other: "
                                      "merge with 'git merge'"};
        }
        if (isBelow(folders, name))
        {
            return Obstacle{name, "'" + name +
                                      "' is a renamed file of one side, in a folder that is a file "
                                      "of the other: merge with 'git merge'"};
        }
    }
    return {};
}

} // namespace

void FilesAgainstFolders::note(WorkingCopy &copy, const TreeChange &change, const git_tree *theirs)
{
    noteFolder(copy, change, theirs);
    if (change.after == nullptr || copy.entryOf(change.path) != nullptr)
    {
        return;
    }
    if (change.before == nullptr && !isGitlink(change.after) && copy.hasEntryBelow(change.path))
    {
        filesOfTheirs_.insert(change.path);
    }
    noteFileAbove(copy, change.path);
}

void FilesAgainstFolders::noteFolder(WorkingCopy &copy, const TreeChange &change,
                                     const git_tree *theirs)
{
    if (change.before == nullptr || isGitlink(change.before))
    {
        return;
    }
    const git_index_entry *const ours = copy.entryOf(change.path);
    if (change.after == nullptr && ours != nullptr && !isOf(*ours, change.before))
    {
        const OwnedTreeEntry other = findInTree(theirs, change.path);
        if (other != nullptr && git_tree_entry_type(other.get()) == GIT_OBJECT_TREE)
        {
            foldersOfTheirs_.insert(change.path);
        }
    }
    else if (change.after != nullptr && ours == nullptr && copy.hasEntryBelow(change.path))
    {
        foldersOfOurs_.insert(change.path);
    }
}

void FilesAgainstFolders::noteFileAbove(WorkingCopy &copy, const std::string &path)
{
    const std::size_t size = path.rfind('/') + 1;
    if (path.compare(0, size, folder_) == 0)
    {
        return;
    }
    folder_ = path.substr(0, size);
    for (auto end = path.find('/'); end != std::string::npos; end = path.find('/', end + 1))
    {
        const std::string above = path.substr(0, end);
        const git_index_entry *const entry = copy.entryOf(above);
        if (entry != nullptr && !isGitlink(entry))
        {
            filesOfOurs_.insert(above);
        }
    }
}

Finding FilesAgainstFolders::find(git_repository *repository, const WorkingCopy &copy,
                                  git_tree *before, git_tree *theirs) const
{
    const auto isChanged = [&](const std::string &path)
    { return !isSame(before, copy.head(), path); };
    const auto wasFolder = [=](const std::string &path) { return isFolderIn(before, path); };
    const Paths files = those(filesOfTheirs_, isChanged);
    const Paths keptByOurs = those(files, wasFolder);
    const Paths keptByTheirs = those(filesOfOurs_, wasFolder);
    const Paths foldersOfOurs = joined(foldersOfOurs_, keptByOurs);
    const Paths foldersOfTheirs = joined(foldersOfTheirs_, keptByTheirs);
    const Paths conflicts = joined(joined(foldersOfOurs, files),
                                   joined(foldersOfTheirs, those(filesOfOurs_, isChanged)));
    Finding found = findSibling(repository, {before, copy.head(), theirs}, conflicts);
    if (!found)
    {
        found = findRenameTo(repository, before, theirs, files, foldersOfTheirs);
    }
    if (!found)
    {
        found = findRenameTo(repository, before, copy.head(), filesOfOurs_, foldersOfOurs);
    }
    if (!found)
    {
        found = findOverlooked(repository, before, copy.head(), keptByOurs);
    }
    return found ? found : findOverlooked(repository, before, theirs, keptByTheirs);
}

} // namespace vclink::git
