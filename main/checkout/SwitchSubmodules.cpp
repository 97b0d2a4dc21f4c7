// SPDX-License-Identifier: MIT
#include "main/checkout/SwitchSubmodules.hpp"

#include <git2/index.h>
#include <git2/tree.h>

#include "error/errorUtil/GitResult.hpp"
#include "main/checkout/gitlinks.hpp"

namespace vclink::git
{

bool SwitchSubmodules::note(WorkingCopy &copy, const TreeChange &change)
{
    copy.readModulesFor(change);
    const bool wasSubmodule = isGitlink(change.before);
    if (wasSubmodule == isGitlink(change.after))
    {
        return false;
    }
    const Standing standing = copy.at(change.path);
    const bool isKept = standing == Standing::Folder && copy.holdsFiles(change.path);
    if (wasSubmodule && change.after == nullptr)
    {
        // libgit2 removes an empty folder, as git does.
        if (isKept || standing != Standing::Folder)
        {
            going_.push_back(change.path);
        }
        return isKept;
    }
    if (change.before == nullptr)
    {
        const bool isComing = isKept && !copy.isFolderInHead(change.path);
        if (isComing)
        {
            coming_.push_back({change.path, *git_tree_entry_id(change.after)});
        }
        return isComing;
    }
    if (standing == Standing::Nothing)
    {
        replaced_.push_back(change.path);
    }
    return false;
}

bool SwitchSubmodules::isEmpty() const noexcept
{
    return coming_.empty() && going_.empty() && replaced_.empty();
}

OwnedHandle<git_index> SwitchSubmodules::makeBaseline(const WorkingCopy &copy) const
{
    OwnedHandle<git_index> baseline = acquire<git_index>(git_index_new).value();
    if (copy.head() != nullptr && copy.hasIndex())
    {
        check(git_index_read_tree, baseline.get(), copy.head());
        for (const auto *const paths : {&going_, &replaced_})
        {
            for (const std::string &path : *paths)
            {
                check(git_index_remove, baseline.get(), path.c_str(), 0);
            }
        }
    }
    addGitlinks(baseline.get(), coming_);
    return baseline;
}

void SwitchSubmodules::settle(git_index *index) const
{
    for (const std::string &path : going_)
    {
        // The entry is already gone if the user has removed it from the index, or if a folder
        // replaces it.
        if (isGitlink(git_index_get_bypath(index, path.c_str(), 0)))
        {
            check(git_index_remove, index, path.c_str(), 0);
        }
    }
    addGitlinks(index, coming_);
}

} // namespace vclink::git
