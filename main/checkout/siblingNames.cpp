// SPDX-License-Identifier: MIT
#include "main/checkout/siblingNames.hpp"

#include <cstddef>

#include <git2/tree.h>

#include "error/errorUtil/GitResult.hpp"
#include "main/checkout/treeChanges.hpp"
#include "util/repository/repository.hpp"

namespace vclink::git
{
namespace
{

Obstacle besideSibling(const std::string &path, const std::string &sibling)
{
    return {path, "'" + path + "' is a file of one side and a folder of the other, beside '" +
                      sibling + "': merge with 'git merge'"};
}

/// Returns a name of the same folder that sortsBetweenFileAndFolder(). Empty if there is none.
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
        if (sortsBetweenFileAndFolder(name, sibling))
        {
            return path.substr(0, start) + sibling;
        }
    }
    return {};
}

} // namespace

bool sortsBetweenFileAndFolder(const std::string &name, const std::string &sibling) noexcept
{
    const bool isLonger =
        sibling.size() > name.size() && sibling.compare(0, name.size(), name) == 0;
    return isLonger && static_cast<unsigned char>(sibling[name.size()]) < '/';
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

} // namespace vclink::git
