// SPDX-License-Identifier: MIT
#include "main/checkout/MergeSubmodules.hpp"

#include <git2/index.h>
#include <git2/tree.h>

#include "error/errorUtil/GitResult.hpp"
#include "main/checkout/gitlinks.hpp"

namespace vclink::git
{
namespace
{

bool isInConflict(git_index *index, const std::string &path)
{
    return git_index_get_bypath(index, path.c_str(), GIT_INDEX_STAGE_ANCESTOR) != nullptr ||
           git_index_get_bypath(index, path.c_str(), GIT_INDEX_STAGE_OURS) != nullptr ||
           git_index_get_bypath(index, path.c_str(), GIT_INDEX_STAGE_THEIRS) != nullptr;
}

} // namespace

void MergeSubmodules::noteChange(WorkingCopy &copy, const TreeChange &change)
{
    copy.readModulesFor(change);
    // A submodule that we removed and they moved is in conflict.
    const bool isComing = isGitlink(change.after) && change.before == nullptr &&
                          copy.entryOf(change.path) == nullptr &&
                          copy.at(change.path) == Standing::Folder &&
                          copy.holdsFiles(change.path) && !copy.isInHead(change.path) &&
                          copy.stagedBelow(change.path).empty();
    if (isComing)
    {
        coming_.push_back({change.path, *git_tree_entry_id(change.after)});
    }
}

void MergeSubmodules::stage(git_index *index) const
{
    addGitlinks(index, coming_);
}

void MergeSubmodules::noteUntracked(WorkingCopy &copy, const std::string &name)
{
    // If libgit2 continues with a merge, only the content of its result is staged.
    if (isGitlink(copy.entryOf(name)))
    {
        going_.push_back(name);
    }
}

bool MergeSubmodules::isEmpty() const noexcept
{
    return going_.empty();
}

void MergeSubmodules::settle(git_index *index) const
{
    for (const std::string &path : going_)
    {
        // libgit2 reports it twice.
        const bool isLeft = isGitlink(git_index_get_bypath(index, path.c_str(), 0));
        if (isLeft && !isInConflict(index, path))
        {
            check(git_index_remove, index, path.c_str(), 0);
        }
    }
}

} // namespace vclink::git
