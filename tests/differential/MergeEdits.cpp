// SPDX-License-Identifier: MIT
#include "MergeEdits.hpp"

#include <algorithm>
#include <iterator>
#include <utility>

#include "historyText.hpp"

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

bool isIn(const std::string &path, const std::string &folder)
{
    return path.compare(0, folder.size() + 1, folder + '/') == 0;
}

void put(Tree &tree, const std::string &path, TreeFile file)
{
    for (auto entry = tree.begin(); entry != tree.end();)
    {
        const bool isInTheWay = isIn(entry->first, path) || isIn(path, entry->first);
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
        const std::string binary = makeBinary(random_);
        put(tree, makePath() + ".bin", {plainMode, binary});
        put(tree, makePath() + ".link", {linkMode, "target" + std::to_string(count)});
    }
    put(tree, "empty", {plainMode, ""});
    put(tree, "lines end otherwise", {plainMode, "one\r\ntwo\r\nthree\r\nand no end"});
    return tree;
}

const std::vector<MergeEdits::Kind> &MergeEdits::kinds()
{
    static const std::vector<Kind> all{
        {"texts edited apart", &MergeEdits::editApart},
        {"one line edited twice", &MergeEdits::editSameLine},
        {"neighbouring lines edited", &MergeEdits::editNeighbours},
        {"lines inserted at one place", &MergeEdits::insertAtOnePlace},
        {"a text edited alike", &MergeEdits::editAlike},
        {"lines moved against edited", &MergeEdits::moveLines},
        {"a file deleted against edited", &MergeEdits::deleteAgainstEdit},
        {"a file added alike", &MergeEdits::addAlike},
        {"a file added differently", &MergeEdits::addDifferently},
        {"a file added similarly", &MergeEdits::addSimilarly},
        {"a file renamed against edited", &MergeEdits::renameAgainstEdit},
        {"a file renamed and edited against edited", &MergeEdits::renameAndEditBoth},
        {"a file renamed alike", &MergeEdits::renameAlike},
        {"a file renamed twice", &MergeEdits::renameApart},
        {"a file renamed against deleted", &MergeEdits::renameAgainstDelete},
        {"a file renamed onto an added one", &MergeEdits::renameOntoAdded},
        {"two files renamed onto one name", &MergeEdits::renameTwoOntoOne},
        {"two names swapped", &MergeEdits::swapNames},
        {"a folder moved against a file added to it", &MergeEdits::moveFolder},
        {"a mode changed against edited", &MergeEdits::setModeAgainstEdit},
        {"a mode changed in a conflict", &MergeEdits::setModeInConflict},
        {"a mode changed against deleted", &MergeEdits::setModeAgainstDelete},
        {"a link changed twice", &MergeEdits::retargetLinks},
        {"a link for a file against edited", &MergeEdits::replaceByLinkAgainstEdit},
        {"a link added against a file", &MergeEdits::addLinkAgainstFile},
        {"a binary file edited once", &MergeEdits::editBinaryOnce},
        {"a binary file edited twice", &MergeEdits::editBinaryTwice},
        {"a folder for a file against edited", &MergeEdits::replaceByFolderAgainstEdit},
        {"a folder added against a file", &MergeEdits::addFolderAgainstFile},
        {"a file renamed onto a folder", &MergeEdits::renameOntoFolder},
    };
    return all;
}

std::size_t MergeEdits::kindCount()
{
    return kinds().size();
}

std::string MergeEdits::nameOfKind(std::size_t kind)
{
    return kinds().at(kind).name;
}

bool MergeEdits::edit(std::size_t kind, Tree &ours, Tree &theirs)
{
    const Edit method = kinds().at(kind).edit;
    return random_.chance(50) ? (this->*method)(ours, theirs) : (this->*method)(theirs, ours);
}

void MergeEdits::editSomething(Tree &tree)
{
    const auto path = pickText(tree, tree);
    if (tree.size() < fewestFiles || !path || (tree.size() < mostFiles && random_.chance(15)))
    {
        const TreeFile file = makeTextFile();
        put(tree, makePath(), file);
    }
    else if (tree.size() > mostFiles || random_.chance(10))
    {
        tree.erase(*path);
    }
    else if (random_.chance(10))
    {
        rename(tree, *path, makePath());
    }
    else
    {
        editTextOf(tree, *path, random_.below(3));
    }
}

bool MergeEdits::editApart(Tree &one, Tree &other)
{
    const auto path = pickText(one, other);
    if (path)
    {
        editTextOf(one, *path, 0);
        editTextOf(other, *path, 2);
    }
    return path.has_value();
}

bool MergeEdits::editSameLine(Tree &one, Tree &other)
{
    const auto path = pickText(one, other);
    if (path)
    {
        const auto line = random_.below(12);
        for (auto *tree : {&one, &other})
        {
            auto &content = (*tree)[*path].content;
            content = replaceLine(content, line, makeUniqueLine(random_));
        }
    }
    return path.has_value();
}

bool MergeEdits::editNeighbours(Tree &one, Tree &other)
{
    const auto path = pickText(one, other);
    if (path)
    {
        const auto line = random_.below(8);
        auto &content = one[*path].content;
        auto &otherContent = other[*path].content;
        content = replaceLine(content, line, makeUniqueLine(random_));
        const std::string otherText = makeUniqueLine(random_);
        const auto otherLine = line + 1 + random_.below(3);
        otherContent = replaceLine(otherContent, otherLine, otherText);
    }
    return path.has_value();
}

bool MergeEdits::insertAtOnePlace(Tree &one, Tree &other)
{
    const auto path = pickText(one, other);
    if (path)
    {
        const auto line = random_.below(12);
        for (auto *tree : {&one, &other})
        {
            auto &content = (*tree)[*path].content;
            content = insertLine(content, line, makeUniqueLine(random_));
        }
    }
    return path.has_value();
}

bool MergeEdits::editAlike(Tree &one, Tree &other)
{
    const auto path = pickText(one, other);
    if (path)
    {
        editTextOf(one, *path, 1);
        other[*path] = one[*path];
        editTextOf(other, *path, 1);
    }
    return path.has_value();
}

bool MergeEdits::moveLines(Tree &one, Tree &other)
{
    const auto path = pickText(one, other);
    if (path)
    {
        one[*path].content = moveBlock(random_, one[*path].content);
        editTextOf(other, *path, random_.below(2));
    }
    return path.has_value();
}

bool MergeEdits::deleteAgainstEdit(Tree &one, Tree &other)
{
    const auto path = pickText(one, other);
    if (path)
    {
        one.erase(*path);
        editTextOf(other, *path, 1);
    }
    return path.has_value();
}

bool MergeEdits::addAlike(Tree &one, Tree &other)
{
    const auto path = makePath();
    const auto file = makeTextFile();
    put(one, path, file);
    put(other, path, file);
    return true;
}

bool MergeEdits::addDifferently(Tree &one, Tree &other)
{
    const auto path = makePath();
    put(one, path, makeTextFile());
    put(other, path, makeTextFile());
    return true;
}

bool MergeEdits::addSimilarly(Tree &one, Tree &other)
{
    const auto path = makePath();
    put(one, path, makeTextFile());
    put(other, path, one[path]);
    editTextOf(one, path, 0);
    editTextOf(other, path, random_.below(3));
    if (random_.chance(30))
    {
        toggleMode(one[path]);
    }
    return true;
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
    return random_.pick(paths);
}

std::optional<std::string> MergeEdits::pickText(const Tree &one, const Tree &other)
{
    return pickCommon(one, other, isLongText);
}

std::string MergeEdits::makePath()
{
    static const std::vector<std::string> folders{"", "src/", "src/core/", "doc/", "tools/"};
    return random_.pick(folders) + "file" + std::to_string(++names_);
}

void MergeEdits::rename(Tree &tree, const std::string &from, const std::string &to)
{
    TreeFile file = tree[from];
    tree.erase(from);
    put(tree, to, std::move(file));
}

void MergeEdits::editTextOf(Tree &tree, const std::string &path, std::size_t third)
{
    auto &content = tree[path].content;
    content = editText(random_, content, thirdOf(content, third));
}

void MergeEdits::toggleMode(TreeFile &file)
{
    file.mode = file.mode == plainMode ? executableMode : plainMode;
}

TreeFile MergeEdits::makeTextFile()
{
    return {random_.chance(10) ? executableMode : plainMode, makeText(random_)};
}

} // namespace vclink::test
