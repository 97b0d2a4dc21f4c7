// SPDX-License-Identifier: MIT
#include "main/checkout/treeChanges.hpp"

#include <cstddef>
#include <cstring>
#include <utility>
#include <vector>

#include <git2/errors.h>
#include <git2/tree.h>

#include "error/errorUtil/GitResult.hpp"
#include "util/repository/objectIds.hpp"
#include "util/repository/repository.hpp"

namespace vclink::git
{
namespace
{

/// One tree, and the position in its entries.
struct Side
{
    OwnedHandle<git_tree> owned;
    const git_tree *tree = nullptr;
    std::size_t next = 0;

    const git_tree_entry *current() const
    {
        return tree != nullptr ? git_tree_entry_byindex(tree, next) : nullptr;
    }
};

/// A folder of both trees. The levels are here and not on the stack, because a hostile repository
/// can have any depth.
struct Level
{
    Side before;
    Side after;
    std::size_t pathSize = 0;
};

bool isSame(const git_tree_entry *left, const git_tree_entry *right)
{
    return left != nullptr && right != nullptr &&
           isSameId(*git_tree_entry_id(left), *git_tree_entry_id(right)) &&
           git_tree_entry_filemode(left) == git_tree_entry_filemode(right);
}

/// Passes over what both sides have, which is most of what there is.
void passSame(Level &level)
{
    for (;; ++level.before.next, ++level.after.next)
    {
        const git_tree_entry *const before = level.before.current();
        const git_tree_entry *const after = level.after.current();
        if (!isSame(before, after) ||
            std::strcmp(git_tree_entry_name(before), git_tree_entry_name(after)) != 0)
        {
            return;
        }
    }
}

/// Returns the byte at this position of a name. In the order of a tree, the name of a folder ends
/// with a slash.
unsigned char byteOf(const git_tree_entry *entry, const char *name, std::size_t place)
{
    const auto byte = static_cast<unsigned char>(name[place]);
    return byte == 0 && isTree(entry) ? '/' : byte;
}

/// As git_tree_entry_cmp, without a function call for each file.
int compare(const git_tree_entry *left, const git_tree_entry *right)
{
    const char *const leftName = git_tree_entry_name(left);
    const char *const rightName = git_tree_entry_name(right);
    std::size_t place = 0;
    while (leftName[place] != 0 && leftName[place] == rightName[place])
    {
        ++place;
    }
    return byteOf(left, leftName, place) - byteOf(right, rightName, place);
}

Side openSide(git_repository *repository, const git_tree_entry *folder)
{
    Side side;
    if (folder != nullptr)
    {
        side.owned = lookupTree(repository, git_tree_entry_id(folder));
        side.tree = side.owned.get();
    }
    return side;
}

/// Returns the next entry of each side, null for a side without the name. A folder and a file never
/// count as the same name.
std::pair<const git_tree_entry *, const git_tree_entry *> takeNext(Level &level)
{
    const git_tree_entry *before = level.before.current();
    const git_tree_entry *after = level.after.current();
    const bool hasBoth = before != nullptr && after != nullptr;
    const int order = hasBoth ? compare(before, after) : 0;
    if (order < 0)
    {
        after = nullptr;
    }
    else if (order > 0)
    {
        before = nullptr;
    }
    level.before.next += before != nullptr ? 1U : 0U;
    level.after.next += after != nullptr ? 1U : 0U;
    return {before, after};
}

} // namespace

OwnedTreeEntry findInTree(const git_tree *tree, const std::string &path)
{
    if (tree == nullptr)
    {
        return nullptr;
    }
    git_tree_entry *raw = nullptr;
    const GitResult<void> found = call(git_tree_entry_bypath, &raw, tree, path.c_str());
    OwnedTreeEntry entry(raw);
    if (found.has_error() && found.error().getCode() == GIT_ENOTFOUND)
    {
        return nullptr;
    }
    check(found);
    return entry;
}

bool isFolderIn(const git_tree *tree, const std::string &path)
{
    const OwnedTreeEntry entry = findInTree(tree, path);
    return entry != nullptr && git_tree_entry_type(entry.get()) == GIT_OBJECT_TREE;
}

void visitTreeChanges(git_repository *repository, const git_tree *before, const git_tree *after,
                      const std::function<bool(const TreeChange &)> &visit)
{
    std::string path;
    std::vector<Level> levels(1);
    levels.back().before.tree = before;
    levels.back().after.tree = after;
    while (!levels.empty())
    {
        passSame(levels.back());
        const auto [left, right] = takeNext(levels.back());
        const git_tree_entry *const either = left != nullptr ? left : right;
        if (either == nullptr)
        {
            levels.pop_back();
        }
        else
        {
            path.resize(levels.back().pathSize);
            path += git_tree_entry_name(either);
            if (isTree(either))
            {
                path += '/';
                levels.push_back(
                    {openSide(repository, left), openSide(repository, right), path.size()});
            }
            else if (!visit({path, left, right}))
            {
                return;
            }
        }
    }
}

} // namespace vclink::git
