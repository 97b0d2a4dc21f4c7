// SPDX-License-Identifier: MIT
#include "main/files/CommitSubmodules.hpp"

#include <algorithm>
#include <cstddef>
#include <iterator>
#include <memory>

#include <git2/commit.h>
#include <git2/errors.h>
#include <git2/repository.h>
#include <git2/tree.h>
#include <sys/stat.h>

#include "error/errorUtil/GitResult.hpp"
#include "main/checkout/gitlinks.hpp"
#include "util/repository/objectIds.hpp"

namespace vclink::git
{
namespace
{

using Trees = std::vector<OwnedHandle<git_tree>>;

using TreeEntry = std::unique_ptr<git_tree_entry, void (*)(git_tree_entry *)>;

/// Returns null if the tree has no entry there.
TreeEntry findEntry(const git_tree *tree, const std::string &path)
{
    git_tree_entry *raw = nullptr;
    const GitResult<void> found = call(git_tree_entry_bypath, &raw, tree, path.c_str());
    TreeEntry entry(raw, git_tree_entry_free);
    if (!found.has_error() || found.error().getCode() != GIT_ENOTFOUND)
    {
        found.value();
    }
    return entry;
}

OwnedHandle<git_tree> treeOf(const git_commit *commit)
{
    return acquire<git_tree>(git_commit_tree, commit).value();
}

bool isAtHead(const git_commit *head, const std::string &path, const git_oid &id)
{
    const TreeEntry entry = findEntry(treeOf(head).get(), path);
    return isGitlink(entry.get()) && isSameId(*git_tree_entry_id(entry.get()), id);
}

bool isSubmoduleIn(const Trees &trees, const std::string &path)
{
    return std::any_of(trees.begin(), trees.end(),
                       [&path](const auto &tree)
                       { return isGitlink(findEntry(tree.get(), path).get()); });
}

/// Returns true if we have removed the submodule that they have moved, and its repository still
/// exists.
bool isTheirsAndThere(git_repository *repository, git_index *index, const git_index_entry &theirs)
{
    const char *const workdir = git_repository_workdir(repository);
    if (workdir == nullptr || GIT_INDEX_ENTRY_STAGE(&theirs) != GIT_INDEX_STAGE_THEIRS ||
        git_index_get_bypath(index, theirs.path, GIT_INDEX_STAGE_OURS) != nullptr)
    {
        return false;
    }
    struct stat status = {};
    return lstat((std::string(workdir) + theirs.path + "/.git").c_str(), &status) == 0;
}

} // namespace

CommitSubmodules::CommitSubmodules(git_repository *repository, git_index *index,
                                   const std::vector<const git_commit *> &parents)
{
    Trees trees;
    const std::size_t count = git_index_entrycount(index);
    for (std::size_t i = 0; i < count; ++i)
    {
        const git_index_entry *const entry = git_index_get_byindex(index, i);
        if (!isGitlink(entry))
        {
            continue;
        }
        if (trees.empty())
        {
            std::transform(parents.begin(), parents.end(), std::back_inserter(trees), treeOf);
        }
        const int stage = GIT_INDEX_ENTRY_STAGE(entry);
        if (stage == GIT_INDEX_STAGE_NORMAL && isSubmoduleIn(trees, entry->path))
        {
            submodules_.push_back({entry->path, *entry});
        }
        else if (stage == GIT_INDEX_STAGE_OURS || isTheirsAndThere(repository, index, *entry))
        {
            conflicts_.push_back({entry->path, *entry});
        }
    }
}

void CommitSubmodules::resolve(git_index *index) const
{
    for (const Submodule &submodule : conflicts_)
    {
        const char *const path = submodule.path.c_str();
        for (const int stage :
             {GIT_INDEX_STAGE_ANCESTOR, GIT_INDEX_STAGE_OURS, GIT_INDEX_STAGE_THEIRS})
        {
            if (git_index_get_bypath(index, path, stage) != nullptr)
            {
                check(git_index_remove, index, path, stage);
            }
        }
        addGitlink(index, {submodule.path, submodule.entry.id});
    }
}

void CommitSubmodules::takeOut(git_index *index) const
{
    for (const Submodule &submodule : submodules_)
    {
        check(git_index_remove, index, submodule.path.c_str(), 0);
    }
}

void CommitSubmodules::restore(git_index *index, const git_commit *head) const
{
    for (const Submodule &submodule : submodules_)
    {
        const char *const path = submodule.path.c_str();
        const git_index_entry *const now = git_index_get_bypath(index, path, 0);
        if (isGitlink(now) && isSameId(now->id, submodule.entry.id))
        {
            continue;
        }
        if (head == nullptr || (isGitlink(now) && isAtHead(head, submodule.path, now->id)))
        {
            git_index_entry entry = submodule.entry;
            entry.path = path;
            check(git_index_add, index, &entry);
        }
    }
}

} // namespace vclink::git
