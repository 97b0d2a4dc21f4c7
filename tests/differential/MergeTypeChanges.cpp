// SPDX-License-Identifier: MIT
#include "MergeEdits.hpp"
#include "historyText.hpp"

/// The changes of MergeEdits that are about modes, links, binary files and folders.
namespace vclink::test
{

bool MergeEdits::setModeAgainstEdit(Tree &one, Tree &other)
{
    const auto path = pickText(one, other);
    if (path)
    {
        toggleMode(one[*path]);
        editTextOf(other, *path, 1);
    }
    return path.has_value();
}

bool MergeEdits::setModeInConflict(Tree &one, Tree &other)
{
    const auto path = pickText(one, other);
    if (path)
    {
        toggleMode(one[*path]);
        editTextOf(one, *path, 1);
        editTextOf(other, *path, 1);
    }
    return path.has_value();
}

bool MergeEdits::setModeAgainstDelete(Tree &one, Tree &other)
{
    const auto path = pickText(one, other);
    if (path)
    {
        toggleMode(one[*path]);
        other.erase(*path);
    }
    return path.has_value();
}

bool MergeEdits::retargetLinks(Tree &one, Tree &other)
{
    const auto path = pickCommon(one, other, isLink);
    if (!path)
    {
        return addLinkAgainstFile(one, other);
    }
    one[*path].content = makePath();
    if (random_.chance(70))
    {
        other[*path].content = makePath();
    }
    return true;
}

bool MergeEdits::replaceByLinkAgainstEdit(Tree &one, Tree &other)
{
    const auto path = pickText(one, other);
    if (path)
    {
        one[*path] = {linkMode, makePath()};
        editTextOf(other, *path, 1);
    }
    return path.has_value();
}

bool MergeEdits::addLinkAgainstFile(Tree &one, Tree &other)
{
    const auto path = makePath() + ".link";
    put(one, path, {linkMode, makePath()});
    put(other, path, random_.chance(30) ? TreeFile{linkMode, makePath()} : makeTextFile());
    return true;
}

bool MergeEdits::editBinaryOnce(Tree &one, Tree &other)
{
    const auto path = pickCommon(one, other, isBinary);
    if (!path)
    {
        const std::string binary = makeBinary(random_);
        put(one, makePath() + ".bin", {plainMode, binary});
        return true;
    }
    one[*path].content = editBinary(random_, one[*path].content);
    if (random_.chance(40))
    {
        rename(other, *path, makePath() + ".bin");
    }
    return true;
}

bool MergeEdits::editBinaryTwice(Tree &one, Tree &other)
{
    const auto path = pickCommon(one, other, isBinary);
    const auto name = path ? *path : makePath() + ".bin";
    for (auto *tree : {&one, &other})
    {
        put(*tree, name,
            {plainMode, path ? editBinary(random_, (*tree)[name].content) : makeBinary(random_)});
    }
    return true;
}

bool MergeEdits::replaceByFolderAgainstEdit(Tree &one, Tree &other)
{
    const auto path = pickText(one, other);
    if (path)
    {
        put(one, *path + "/inner", makeTextFile());
        editTextOf(other, *path, 1);
    }
    return path.has_value();
}

bool MergeEdits::addFolderAgainstFile(Tree &one, Tree &other)
{
    const auto path = makePath();
    put(one, path + "/inner", makeTextFile());
    put(other, path, makeTextFile());
    return true;
}

} // namespace vclink::test
