// SPDX-License-Identifier: MIT
#include "main/mergeState/interruptedMerge.hpp"

#include <algorithm>
#include <cerrno>
#include <memory>
#include <string>
#include <vector>

#include <git2/commit.h>
#include <git2/diff.h>
#include <git2/errors.h>
#include <git2/index.h>
#include <git2/oid.h>
#include <git2/repository.h>
#include <git2/tree.h>
#include <sys/stat.h>

#include "error/errorUtil/GitResult.hpp"
#include "error/errorUtil/callbackException.hpp"
#include "error/errorUtil/raiseGitError.hpp"
#include "error/errorUtil/raiseSystemError.hpp"
#include "main/mergeState/MergeBases.hpp"
#include "main/mergeState/MergeMarker.hpp"
#include "util/repository/objectIds.hpp"
#include "util/repository/repository.hpp"
#include "util/scope/wholeFile.hpp"

namespace vclink::git
{
namespace
{

/// Stages every file in a place where the merge may have written, which distinguishes new files
/// from untracked ones. Keeps them in the stash if there are any, and restores what HEAD has.
/// Everything else stays. Leaves out folders in the places of files that are not written yet,
/// because they would stop the staging.
constexpr const char *wayOut =
    "To begin again, run in the root of the working copy: git diff-tree -r -z --name-only HEAD "
    "MERGE_HEAD | xargs -0 sh -c 'for f; do [ -d \"$f\" ] && [ ! -L \"$f\" ] || "
    "printf \"%s\\0\" \"$f\"; done' sh | git update-index -z --add --remove --replace --stdin; "
    "git stash create | xargs -r git stash store; git merge --abort";

/// @throws LibGit2Exception if the path cannot be examined
bool exists(const std::string &path)
{
    struct stat status = {};
    const bool isThere = ::lstat(path.c_str(), &status) == 0;
    if (!isThere && errno != ENOENT)
    {
        raiseSystemError(errno, "could not read '" + path + "'");
    }
    return isThere;
}

enum class MergeMode
{
    None,
    /// What libgit2 writes for every merge, and git only for a requested merge commit.
    OfLibGit2,
    OfGit
};

MergeMode readMergeMode(const std::string &path)
{
    const std::string ofLibGit2 = "no-ff";
    std::string text;
    const int error = readWholeFile(path, text);
    if (error == ENOENT)
    {
        return MergeMode::None;
    }
    if (error != 0)
    {
        raiseSystemError(error, "could not read '" + path + "'");
    }
    return text == ofLibGit2 ? MergeMode::OfLibGit2 : MergeMode::OfGit;
}

OwnedHandle<git_tree> treeOf(const git_commit *commit)
{
    return acquire<git_tree>(git_commit_tree, commit).value();
}

/// A file of a tree or an index. The mode is 0 if it does not exist.
struct File
{
    git_oid id = {};
    unsigned mode = 0;

    bool operator==(const File &other) const
    {
        return mode == other.mode && (mode == 0 || isSameId(id, other.id));
    }
};

File findInTree(const git_tree *tree, const char *path)
{
    git_tree_entry *raw = nullptr;
    const GitResult<void> found = call(git_tree_entry_bypath, &raw, tree, path);
    const std::unique_ptr<git_tree_entry, void (*)(git_tree_entry *)> entry(raw,
                                                                            git_tree_entry_free);
    if (found.has_error() && found.error().getCode() == GIT_ENOTFOUND)
    {
        return {};
    }
    found.value();
    return {*git_tree_entry_id(raw), git_tree_entry_filemode(raw)};
}

File findInIndex(git_index *index, const char *path)
{
    const git_index_entry *const entry = git_index_get_bypath(index, path, 0);
    return entry == nullptr ? File{} : File{entry->id, entry->mode};
}

/// Searches the changes of theirs for one that ours has not touched.
struct Search
{
    const std::vector<OwnedHandle<git_tree>> &bases;
    const git_tree *ours;
    git_index *index;
    bool hasChange = false;
    bool hasNewFile = false;
    /// They have deleted a file that we have deleted or changed. If they have renamed it, their new
    /// file is part of a conflict. A file that becomes a link is such a file, too.
    bool mayBeRenamed = false;
    bool isTaken = false;
};

/// Returns true if the file is in ours as in all bases. If these differ, a merge can decide for
/// ours.
bool isUntouched(const Search &search, const char *path, const File &before, const File &ours)
{
    return before == ours && std::all_of(search.bases.begin() + 1, search.bases.end(),
                                         [&](const OwnedHandle<git_tree> &base)
                                         { return findInTree(base.get(), path) == ours; });
}

/// Keeps no delta, and ends the comparison when the answer is known.
int lookAt(const git_diff * /*diff*/, const git_diff_delta *delta, const char * /*pathspec*/,
           void *payload) noexcept
{
    constexpr int skip = 1;
    try
    {
        auto &search = *static_cast<Search *>(payload);
        const char *const path = delta->new_file.path;
        const File before{delta->old_file.id, delta->old_file.mode};
        const File ours = findInTree(search.ours, path);
        if (isUntouched(search, path, before, ours))
        {
            (before.mode == 0 ? search.hasNewFile : search.hasChange) = true;
            search.isTaken = !(findInIndex(search.index, path) == ours);
        }
        else if (delta->status == GIT_DELTA_DELETED)
        {
            search.mayBeRenamed = true;
        }
        return search.isTaken ? GIT_EUSER : skip;
    }
    catch (...)
    {
        return parkCallbackException();
    }
}

/// Returns true if only theirs has changed some files, and the index has none of these changes.
bool isNothingTaken(git_repository *repository, const git_commit *ours, const git_commit *theirs)
{
    const std::vector<OwnedHandle<git_tree>> bases =
        readTrees(repository, MergeBases(repository, git_commit_id(ours), git_commit_id(theirs)));
    const OwnedHandle<git_tree> oursTree = treeOf(ours);
    const OwnedHandle<git_tree> theirsTree = treeOf(theirs);
    const OwnedHandle<git_index> index = getRepositoryIndex(repository);
    Search search{bases, oursTree.get(), index.get()};
    git_diff_options options{};
    check(git_diff_options_init, &options, unsigned{GIT_DIFF_OPTIONS_VERSION});
    options.notify_cb = lookAt;
    options.payload = &search;
    git_diff *raw = nullptr;
    const GitResult<void> compared = call(git_diff_tree_to_tree, &raw, repository,
                                          bases.front().get(), theirsTree.get(), &options);
    const std::unique_ptr<git_diff, void (*)(git_diff *)> diff(raw, git_diff_free);
    if (search.isTaken)
    {
        return false;
    }
    compared.value();
    return search.hasChange || (search.hasNewFile && !search.mayBeRenamed);
}

} // namespace

void refuseInterruptedMerge(git_repository *repository, const git_commit *ours,
                            const git_commit *theirs)
{
    const std::string folder = git_repository_path(repository);
    const bool isSame = isSameId(*git_commit_tree_id(ours), *git_commit_tree_id(theirs));
    if (isSame || exists(folder + "AUTO_MERGE"))
    {
        return;
    }
    const MergeMode mode = readMergeMode(folder + "MERGE_MODE");
    const std::string name = git_oid_tostr_s(git_commit_id(theirs));
    // If git merges now, the marker is that of an earlier merge, which git has aborted.
    if (mode != MergeMode::OfGit && hasMergeMarker(repository, *git_commit_id(theirs)))
    {
        raiseGitError(GIT_ERROR, GIT_ERROR_MERGE,
                      "the merge of " + name +
                          " was interrupted before all of it was written, and a commit would "
                          "leave the rest out. " +
                          wayOut);
    }
    if (mode == MergeMode::OfLibGit2 && isNothingTaken(repository, ours, theirs))
    {
        raiseGitError(GIT_ERROR, GIT_ERROR_MERGE,
                      "nothing of what only " + name +
                          " has changed is in the index, because its merge was interrupted or "
                          "was put back, and a commit would record it as merged. If that is "
                          "meant, run: git commit. " +
                          wayOut);
    }
}

} // namespace vclink::git
