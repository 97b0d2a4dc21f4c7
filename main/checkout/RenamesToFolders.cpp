// SPDX-License-Identifier: MIT
#include "main/checkout/RenamesToFolders.hpp"

#include <algorithm>
#include <cstddef>
#include <initializer_list>
#include <iterator>
#include <limits>
#include <memory>

#include <git2/diff.h>
#include <git2/errors.h>
#include <git2/tree.h>

#include "error/errorUtil/GitResult.hpp"
#include "main/checkout/gitlinks.hpp"
#include "util/repository/repository.hpp"

namespace vclink::git
{
namespace
{

using Diff = std::unique_ptr<git_diff, void (*)(git_diff *)>;

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

/// libgit2 sees such a conflict only if the names are next to each other.
Obstacle besideSibling(const std::string &path, const std::string &sibling)
{
    return {path, "'" + path + "' is a file of one side and a folder of the other, beside '" +
                      sibling + "': merge with 'git merge'"};
}

/// Returns true if both trees have this file or folder, with the same content.
bool isSame(const git_tree *left, const git_tree *right, const std::string &path)
{
    const OwnedTreeEntry leftEntry = findInTree(left, path);
    const OwnedTreeEntry rightEntry = findInTree(right, path);
    return leftEntry != nullptr && rightEntry != nullptr &&
           isSameId(*git_tree_entry_id(leftEntry.get()), *git_tree_entry_id(rightEntry.get()));
}

/// Returns a name of the same folder that sorts between the path and what is below it, as "lib-1"
/// and "lib.txt" do for "lib". Empty if there is none.
std::string siblingIn(git_repository *repository, const git_tree *tree, const std::string &path)
{
    const std::size_t start = path.rfind('/') + 1;
    OwnedHandle<git_tree> parent;
    if (start > 0)
    {
        const OwnedTreeEntry entry = findInTree(tree, path.substr(0, start - 1));
        if (entry == nullptr || git_tree_entry_type(entry.get()) != GIT_OBJECT_TREE)
        {
            return {};
        }
        parent = lookupTree(repository, git_tree_entry_id(entry.get()));
        tree = parent.get();
    }
    const std::string name = path.substr(start);
    const std::size_t count = tree != nullptr ? git_tree_entrycount(tree) : 0;
    for (std::size_t i = 0; i < count; ++i)
    {
        const std::string sibling = git_tree_entry_name(git_tree_entry_byindex(tree, i));
        const bool isLonger =
            sibling.size() > name.size() && sibling.compare(0, name.size(), name) == 0;
        if (isLonger && static_cast<unsigned char>(sibling[name.size()]) < '/')
        {
            return path.substr(0, start) + sibling;
        }
    }
    return {};
}

Finding findSibling(git_repository *repository, std::initializer_list<const git_tree *> trees,
                    const std::set<std::string> &paths)
{
    for (const std::string &path : paths)
    {
        for (const git_tree *const tree : trees)
        {
            const std::string sibling = siblingIn(repository, tree, path);
            if (!sibling.empty())
            {
                return besideSibling(path, sibling);
            }
        }
    }
    return {};
}

bool isBelow(const std::set<std::string> &folders, const std::string &path)
{
    for (auto end = path.find('/'); end != std::string::npos; end = path.find('/', end + 1))
    {
        if (folders.count(path.substr(0, end)) != 0)
        {
            return true;
        }
    }
    return false;
}

Finding findRenameTo(git_repository *repository, git_tree *before, git_tree *after,
                     const std::set<std::string> &files, const std::set<std::string> &folders)
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

void RenamesToFolders::note(WorkingCopy &copy, const TreeChange &change, const git_tree *theirs)
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

void RenamesToFolders::noteFolder(WorkingCopy &copy, const TreeChange &change,
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

void RenamesToFolders::noteFileAbove(WorkingCopy &copy, const std::string &path)
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

Finding RenamesToFolders::find(git_repository *repository, const WorkingCopy &copy,
                               git_tree *before, git_tree *theirs) const
{
    std::set<std::string> files;
    for (const std::string &file : filesOfTheirs_)
    {
        if (!isSame(before, copy.head(), file))
        {
            files.insert(file);
        }
    }
    std::set<std::string> foldersOfOurs = foldersOfOurs_;
    std::copy_if(files.begin(), files.end(), std::inserter(foldersOfOurs, foldersOfOurs.end()),
                 [=](const std::string &file) { return isFolderIn(before, file); });
    std::set<std::string> foldersOfTheirs = foldersOfTheirs_;
    std::copy_if(filesOfOurs_.begin(), filesOfOurs_.end(),
                 std::inserter(foldersOfTheirs, foldersOfTheirs.end()),
                 [=](const std::string &file) { return isFolderIn(before, file); });
    std::set<std::string> conflicts = foldersOfOurs;
    conflicts.insert(files.begin(), files.end());
    conflicts.insert(foldersOfTheirs.begin(), foldersOfTheirs.end());
    std::copy_if(filesOfOurs_.begin(), filesOfOurs_.end(),
                 std::inserter(conflicts, conflicts.end()),
                 [&](const std::string &file) { return !isSame(before, copy.head(), file); });
    Finding found = findSibling(repository, {before, copy.head(), theirs}, conflicts);
    if (!found)
    {
        found = findRenameTo(repository, before, theirs, files, foldersOfTheirs);
    }
    return found ? found
                 : findRenameTo(repository, before, copy.head(), filesOfOurs_, foldersOfOurs);
}

} // namespace vclink::git
