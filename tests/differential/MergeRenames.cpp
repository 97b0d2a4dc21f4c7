// SPDX-License-Identifier: MIT
#include <utility>
#include <vector>

#include "MergeEdits.hpp"

/// The changes of MergeEdits that give files other names.
namespace vclink::test
{
namespace
{

std::string folderOfPath(const std::string &path)
{
    const auto slash = path.rfind('/');
    return slash == std::string::npos ? std::string() : path.substr(0, slash);
}

} // namespace

bool MergeEdits::renameAgainstEdit(Tree &one, Tree &other)
{
    const auto path = pickText(one, other);
    if (path)
    {
        rename(one, *path, makePath());
        editTextOf(other, *path, random_.below(3));
    }
    return path.has_value();
}

bool MergeEdits::renameAndEditBoth(Tree &one, Tree &other)
{
    const auto path = pickText(one, other);
    if (path)
    {
        const auto renamed = makePath();
        rename(one, *path, renamed);
        editTextOf(one, renamed, 0);
        editTextOf(other, *path, random_.chance(50) ? 0 : 2);
    }
    return path.has_value();
}

bool MergeEdits::renameAlike(Tree &one, Tree &other)
{
    const auto path = pickText(one, other);
    if (path)
    {
        const auto renamed = makePath();
        rename(one, *path, renamed);
        rename(other, *path, renamed);
        editTextOf(one, renamed, 0);
        editTextOf(other, renamed, random_.chance(30) ? 0 : 2);
    }
    return path.has_value();
}

bool MergeEdits::renameApart(Tree &one, Tree &other)
{
    const auto path = pickText(one, other);
    if (path)
    {
        const auto renamed = makePath();
        rename(one, *path, renamed);
        rename(other, *path, makePath());
        if (random_.chance(50))
        {
            editTextOf(one, renamed, 0);
        }
    }
    return path.has_value();
}

bool MergeEdits::renameAgainstDelete(Tree &one, Tree &other)
{
    const auto path = pickText(one, other);
    if (path)
    {
        rename(one, *path, makePath());
        other.erase(*path);
    }
    return path.has_value();
}

bool MergeEdits::renameOntoAdded(Tree &one, Tree &other)
{
    const auto path = pickText(one, other);
    if (path)
    {
        const auto renamed = makePath();
        rename(one, *path, renamed);
        put(other, renamed, makeTextFile());
    }
    return path.has_value();
}

bool MergeEdits::renameTwoOntoOne(Tree &one, Tree &other)
{
    const auto first = pickText(one, other);
    const auto second = pickText(one, other);
    if (!first || first == second)
    {
        return false;
    }
    const auto renamed = makePath();
    rename(one, *first, renamed);
    rename(other, *second, renamed);
    return true;
}

bool MergeEdits::swapNames(Tree &one, Tree &other)
{
    const auto first = pickText(one, other);
    const auto second = pickText(one, other);
    if (!first || first == second)
    {
        return false;
    }
    std::swap(one[*first], one[*second]);
    editTextOf(other, *first, random_.below(3));
    return true;
}

bool MergeEdits::moveFolder(Tree &one, Tree &other)
{
    const auto path = pickText(one, other);
    const auto folder = path ? folderOfPath(*path) : std::string();
    if (folder.empty())
    {
        return false;
    }
    const auto renamed = "moved" + std::to_string(++names_);
    std::vector<std::string> paths;
    for (const auto &[name, file] : one)
    {
        if (isIn(name, folder))
        {
            paths.push_back(name);
        }
    }
    for (const auto &name : paths)
    {
        rename(one, name, renamed + name.substr(folder.size()));
    }
    put(other, folder + "/added" + std::to_string(names_), makeTextFile());
    editTextOf(other, *path, 1);
    return true;
}

bool MergeEdits::renameOntoFolder(Tree &one, Tree &other)
{
    const auto path = pickText(one, other);
    if (path)
    {
        const auto renamed = makePath();
        rename(one, *path, renamed);
        put(other, renamed + "/inner", makeTextFile());
    }
    return path.has_value();
}

} // namespace vclink::test
