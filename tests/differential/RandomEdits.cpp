// SPDX-License-Identifier: MIT
#include "RandomContent.hpp"
#include "RandomWorkingCopy.hpp"

namespace vclink::test
{

void RandomWorkingCopy::changeWorkingTree()
{
    for (const auto &path : tracked_)
    {
        if (random_.chance(rate_) && (maker_.isFile(path) || maker_.isLink(path)))
        {
            edit(path);
        }
    }
    for (const auto &path : submodules_)
    {
        changeSubmodule(path);
    }
    if (random_.chance(rate_ / 2))
    {
        changeFolder();
    }
    addUntracked();
    if (random_.chance(12))
    {
        writeIgnoreFile();
    }
    if (random_.chance(8))
    {
        addNestedRepository();
    }
}

void RandomWorkingCopy::edit(const std::string &path)
{
    const std::size_t kind = random_.below(10);
    if (kind < 3)
    {
        return maker_.remove(path);
    }
    if (kind == 3)
    {
        return changeType(path);
    }
    if (kind == 4)
    {
        return replaceByFolder(path);
    }
    if (maker_.isLink(path))
    {
        return maker_.link(makeLinkTarget(path), path);
    }
    if (kind == 5)
    {
        return maker_.setExecutable(path, random_.chance(70));
    }
    const std::string content = maker_.read(path);
    if (kind == 6)
    {
        return maker_.write(path, content);
    }
    maker_.write(path, random_.chance(50) ? makeSameSize(random_, content) : makeContent(random_));
}

void RandomWorkingCopy::changeType(const std::string &path)
{
    if (path == ".gitignore")
    {
        // Not a link, which libgit2 follows there and git does not.
        maker_.write(path, makeIgnoreRules(random_));
    }
    else if (maker_.isLink(path))
    {
        maker_.write(path, random_.chance(50) ? maker_.readLink(path) : makeContent(random_));
    }
    else
    {
        maker_.link(makeLinkTarget(path), path);
    }
}

void RandomWorkingCopy::replaceByFolder(const std::string &path)
{
    maker_.remove(path);
    maker_.makeFolder(path);
    if (random_.chance(80))
    {
        maker_.write(path + "/inner", makeContent(random_));
    }
    if (random_.chance(30))
    {
        maker_.write(path + "/deeper/inner.log", makeContent(random_));
    }
}

void RandomWorkingCopy::changeFolder()
{
    const std::string folder = someTrackedFolder();
    if (folder.empty() || !maker_.isFolder(folder))
    {
        return;
    }
    maker_.remove(folder);
    switch (random_.below(4))
    {
    case 0:
        return maker_.write(folder, makeContent(random_));
    case 1:
        // Never a link to itself: git cannot report files below such a link.
        return maker_.link(random_.chance(50) ? "missing" : "..", folder);
    case 2:
        return maker_.makeFolder(folder);
    default:
        return;
    }
}

void RandomWorkingCopy::addUntracked()
{
    for (std::size_t count = random_.below(6); count > 0; --count)
    {
        const std::string path = freshPath();
        if (path.empty())
        {
            continue;
        }
        switch (random_.below(8))
        {
        case 0:
            maker_.link(makeLinkTarget(path), path);
            break;
        case 1:
            maker_.makeFolder(path);
            break;
        case 2:
            maker_.write(path + "/deeper/and deeper/" + std::to_string(count), "x");
            break;
        default:
            maker_.write(path, makeContent(random_));
        }
    }
}

void RandomWorkingCopy::writeIgnoreFile()
{
    if (random_.chance(30))
    {
        return maker_.write(".git/info/exclude", makeIgnoreRules(random_));
    }
    const std::string folder = random_.chance(40) ? std::string() : names_.someFolder();
    const std::string path = folder.empty() ? ".gitignore" : folder + "/.gitignore";
    if (maker_.canHold(path))
    {
        maker_.write(path, makeIgnoreRules(random_));
    }
}

} // namespace vclink::test
