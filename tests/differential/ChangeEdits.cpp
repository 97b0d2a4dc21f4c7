// SPDX-License-Identifier: MIT
#include <chrono>
#include <filesystem>

#include "ChangeSequence.hpp"
#include "RandomContent.hpp"

namespace vclink::test
{

void ChangeSequence::edit()
{
    if (random_.chance(3) && !twins_.workingTree().isFolder(".gitignore"))
    {
        return write(".gitignore", makeIgnoreRules(random_));
    }
    const Names paths = listable([](const GitFile &) { return true; });
    if (paths.empty() || random_.chance(35))
    {
        return addUntracked();
    }
    const std::string path = random_.pick(paths);
    if (random_.chance(5) && path.find('/') != std::string::npos)
    {
        return replaceByFile(path.substr(0, path.rfind('/')));
    }
    editFile(path);
}

void ChangeSequence::editFile(const std::string &path)
{
    const auto &tree = twins_.workingTree();
    if (!tree.canHold(path) || tree.isFolder(path))
    {
        return;
    }
    if (!tree.exists(path))
    {
        return write(path, makeContent(random_));
    }
    const std::size_t kind = random_.below(12);
    if (kind < 2)
    {
        return twins_.edit([&path](WorkingCopyMaker &maker) { maker.remove(path); });
    }
    if (kind == 2)
    {
        return changeType(path);
    }
    if (kind == 3 && random_.chance(60))
    {
        return replaceByFolder(path);
    }
    if (kind == 4 && tree.isFile(path))
    {
        const bool executable = random_.chance(70);
        return twins_.edit([&path, executable](WorkingCopyMaker &maker)
                           { maker.setExecutable(path, executable); });
    }
    const std::string content = tree.isFile(path) ? tree.read(path) : std::string();
    switch (random_.below(4))
    {
    case 0:
        return write(path, makeContent(random_));
    case 1:
        return write(path, makeSameSize(random_, content));
    default:
        return write(path, makeSimilar(random_, content));
    }
}

void ChangeSequence::changeType(const std::string &path)
{
    const auto &tree = twins_.workingTree();
    if (tree.isLink(path) || path == ".gitignore")
    {
        return write(path, makeContent(random_));
    }
    link(path);
}

/// Never to itself: what such a link means cannot be asked.
void ChangeSequence::link(const std::string &path)
{
    const std::string made = makeLinkTarget();
    const bool isItself = path.substr(path.rfind('/') + 1) == made;
    const std::string target = isItself ? "missing" : made;
    twins_.edit([&](WorkingCopyMaker &maker) { maker.link(target, path); });
}

void ChangeSequence::replaceByFolder(const std::string &path)
{
    const std::string inner = makeContent(random_);
    twins_.edit(
        [&](WorkingCopyMaker &maker)
        {
            maker.remove(path);
            maker.write(path + "/inner", inner);
        });
}

void ChangeSequence::replaceByFile(const std::string &folder)
{
    if (!twins_.workingTree().isFolder(folder))
    {
        return;
    }
    twins_.edit([&folder](WorkingCopyMaker &maker) { maker.remove(folder); });
    if (random_.chance(60))
    {
        write(folder, makeContent(random_));
    }
}

void ChangeSequence::addUntracked()
{
    const std::string ignored = random_.chance(15) ? ".log" : "";
    const std::string path = freshPath() + ignored;
    if (path == ignored || twins_.workingTree().exists(path))
    {
        return;
    }
    made_.push_back(path);
    if (random_.chance(10))
    {
        return link(path);
    }
    write(path, makeContent(random_));
}

void ChangeSequence::write(const std::string &path, const std::string &content)
{
    const auto &tree = twins_.workingTree();
    const bool sameSize = tree.isFile(path) && tree.read(path).size() == content.size();
    // libgit2 compares times by nanoseconds, git by seconds. If libgit2 writes the index later,
    // git cannot see a change of the same size in the second in which the file was checked out.
    // Such a change has another time here.
    const auto time = std::filesystem::file_time_type::clock::now() - ++hours_;
    twins_.edit(
        [&](WorkingCopyMaker &maker)
        {
            maker.write(path, content);
            if (sameSize)
            {
                std::filesystem::last_write_time(maker.repository() / path, time);
            }
        });
}

std::string ChangeSequence::makeLinkTarget()
{
    // None can lead in a circle, on which a list fails.
    static const Names targets{"missing",         "a",      "..",     ".",
                               "/nowhere/at all", "src/a1", "../src", "\xFF/a"};
    return random_.pick(targets);
}

} // namespace vclink::test
