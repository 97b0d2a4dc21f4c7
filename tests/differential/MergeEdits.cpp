// SPDX-License-Identifier: MIT
#include "MergeEdits.hpp"

#include <algorithm>
#include <iterator>
#include <utility>

#include "historyText.hpp"
#include "listedNames.hpp"

namespace vclink::test
{
namespace
{

constexpr std::size_t fewestFiles = 24;
constexpr std::size_t mostFiles = 40;

} // namespace

bool isLink(const TreeFile &file)
{
    return file.mode == linkMode;
}

bool isBinary(const TreeFile &file)
{
    return !isLink(file) && file.content.find('\0') != std::string::npos;
}

bool isLongText(const TreeFile &file)
{
    return !isLink(file) && !isBinary(file) &&
           std::count(file.content.begin(), file.content.end(), '\n') >= 12;
}

void put(Tree &tree, const std::string &path, TreeFile file)
{
    for (auto entry = tree.begin(); entry != tree.end();)
    {
        const bool isInTheWay = isBelow(entry->first, path) || isBelow(path, entry->first);
        entry = isInTheWay ? tree.erase(entry) : std::next(entry);
    }
    tree[path] = std::move(file);
}

Tree MergeEdits::makeTree()
{
    Tree tree;
    while (tree.size() < fewestFiles)
    {
        const TreeFile file = makeTextFile();
        put(tree, makePath(), file);
    }
    for (int count = 0; count < 3; ++count)
    {
        const std::string binary = makeBinary(random);
        put(tree, makePath() + ".bin", {plainMode, binary});
        put(tree, makePath() + ".link", {linkMode, "target" + std::to_string(count)});
    }
    put(tree, "empty", {plainMode, ""});
    put(tree, "lines end otherwise", {plainMode, "one\r\ntwo\r\nthree\r\nand no end"});
    return tree;
}

const std::vector<MergeEdits::Kind> &MergeEdits::kinds()
{
    static const std::vector<Kind> all = []
    {
        std::vector<Kind> kinds = contentEdits;
        for (const auto *more : {&renames, &typeChanges})
            kinds.insert(kinds.end(), more->begin(), more->end());
        return kinds;
    }();
    return all;
}

bool MergeEdits::edit(const Kind &kind, Tree &ours, Tree &theirs)
{
    return random.chance(50) ? kind.edit(*this, ours, theirs) : kind.edit(*this, theirs, ours);
}

void MergeEdits::editSomething(Tree &tree)
{
    const auto path = pickText(tree, tree);
    if (tree.size() < fewestFiles || !path || (tree.size() < mostFiles && random.chance(15)))
    {
        const TreeFile file = makeTextFile();
        put(tree, makePath(), file);
    }
    else if (tree.size() > mostFiles || random.chance(10))
    {
        tree.erase(*path);
    }
    else if (random.chance(10))
    {
        renameAnyhow(tree, *path);
    }
    else
    {
        editTextOf(tree, *path, random.below(3));
    }
}

std::optional<std::string> MergeEdits::pickCommon(const Tree &one, const Tree &other,
                                                  const Selection &isWanted)
{
    std::vector<std::string> paths;
    for (const auto &[path, file] : one)
    {
        const auto found = other.find(path);
        if (found != other.end() && isWanted(file) && isWanted(found->second))
        {
            paths.push_back(path);
        }
    }
    if (paths.empty())
    {
        return std::nullopt;
    }
    return random.pick(paths);
}

std::optional<std::string> MergeEdits::pickText(const Tree &one, const Tree &other)
{
    return pickCommon(one, other, isLongText);
}

std::string MergeEdits::makePath()
{
    static const std::vector<std::string> folders{"", "src/", "src/core/", "doc/", "tools/"};
    return random.pick(folders) + "file" + makeNumber();
}

std::string MergeEdits::makeNumber()
{
    return std::to_string(++names_);
}

void MergeEdits::rename(Tree &tree, const std::string &from, const std::string &to)
{
    TreeFile file = tree[from];
    tree.erase(from);
    put(tree, to, std::move(file));
}

std::string MergeEdits::renameAnyhow(Tree &tree, const std::string &from)
{
    const std::string to = makePath();
    rename(tree, from, to);
    return to;
}

void MergeEdits::editTextOf(Tree &tree, const std::string &path, std::size_t third)
{
    auto &content = tree[path].content;
    content = editText(random, content, thirdOf(content, third));
}

TreeFile MergeEdits::makeTextFile()
{
    return {random.chance(10) ? executableMode : plainMode, makeText(random)};
}

MergeEdits::Kind ofText(const std::string &name, const TextEdit &edit)
{
    return {name, [edit](MergeEdits &edits, Tree &one, Tree &other)
            {
                const auto path = edits.pickText(one, other);
                if (path)
                    edit(edits, one, other, *path);
                return path.has_value();
            }};
}

void toggleMode(TreeFile &file)
{
    file.mode = file.mode == plainMode ? executableMode : plainMode;
}

} // namespace vclink::test
