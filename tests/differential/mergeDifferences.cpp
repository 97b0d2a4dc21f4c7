// SPDX-License-Identifier: MIT
#include "mergeDifferences.hpp"

#include <algorithm>
#include <sstream>
#include <string_view>

#include "listedNames.hpp"
#include "support/strings.hpp"

namespace vclink::test
{
namespace
{

bool endsWith(const std::string &text, const std::string &end)
{
    return text.size() > end.size() && text.compare(text.size() - end.size(), end.size(), end) == 0;
}

std::string withoutSide(const std::string &name, const MergeCommit &merge)
{
    for (const auto &suffix : {std::string("~HEAD"), '~' + merge.secondParent})
    {
        if (endsWith(name, suffix))
        {
            return name.substr(0, name.size() - suffix.size());
        }
    }
    return name;
}

bool holdsSomething(const std::map<std::string, std::string> &names, const std::string &folder)
{
    const auto first = names.lower_bound(folder + '/');
    return first != names.end() && isBelow(first->first, folder);
}

bool holdsFile(const std::map<std::string, std::string> &files, const std::string &modeAndId)
{
    return std::any_of(files.begin(), files.end(),
                       [&modeAndId](const auto &file) { return file.second == modeAndId; });
}

/// "120000" is of another type than the two modes of a file.
bool areOfOneType(const std::string &left, const std::string &right)
{
    return left.substr(0, 2) == right.substr(0, 2);
}

const MergedPath &at(const MergedPaths &paths, const std::string &path)
{
    static const MergedPath nothing;
    const auto found = paths.find(path);
    return found == paths.end() ? nothing : found->second;
}

} // namespace

bool operator==(const MergedPath &left, const MergedPath &right)
{
    return left.entries == right.entries && left.entryNames == right.entryNames &&
           left.files == right.files;
}

bool operator!=(const MergedPath &left, const MergedPath &right)
{
    return !(left == right);
}

MergedPaths readMergedPaths(const GitRepository &repository, const MergeCommit &merge)
{
    MergedPaths paths;
    for (const auto &[name, text] : indexOf(repository))
    {
        const auto lines = split(text);
        MergedPath &path = paths[withoutSide(name, merge)];
        path.entries.insert(lines.begin(), lines.end());
        path.entryNames.insert(name);
    }
    const auto files = workingTreeOf(repository);
    for (const auto &[name, content] : files)
    {
        if (!holdsSomething(files, name))
        {
            paths[withoutSide(name, merge)].files.emplace(name, content);
        }
    }
    return paths;
}

std::set<std::string> findDifferences(const MergedPaths &left, const MergedPaths &right)
{
    std::set<std::string> differences;
    for (const auto *paths : {&left, &right})
    {
        for (const auto &[path, merged] : *paths)
        {
            if (at(left, path) != at(right, path))
            {
                differences.insert(path);
            }
        }
    }
    return differences;
}

std::string describe(const MergedPaths &paths, const std::string &path)
{
    const MergedPath &merged = at(paths, path);
    std::string text;
    for (const auto &entry : merged.entries)
    {
        text += "    " + entry + '\n';
    }
    for (const auto &name : merged.entryNames)
    {
        text += "    under the name " + name + '\n';
    }
    for (const auto &[name, content] : merged.files)
    {
        text += "    " + name + ": " + content + '\n';
    }
    return text;
}

MergeExplanations::MergeExplanations(const GitRepository &repository, const MergeCommit &merge)
    : ours_(listFiles(repository, merge.firstParent)),
      theirs_(listFiles(repository, merge.secondParent))
{
    std::istringstream lines(
        repository.git({"merge-base", "--all", merge.firstParent, merge.secondParent}));
    for (std::string base; lines >> base;)
    {
        bases_.push_back(listFiles(repository, base));
        addRenames(repository, base, merge.firstParent);
        addRenames(repository, base, merge.secondParent);
    }
}

std::string MergeExplanations::explain(const std::string &path, const MergedPaths &byLibrary,
                                       const MergedPaths &byGit) const
{
    const MergedPath &library = at(byLibrary, path);
    const MergedPath &git = at(byGit, path);
    const bool sameEntries = library.entries == git.entries;
    if (sameEntries && isFolderInTheWay(path))
    {
        return "git moves a file aside where a folder is in the way";
    }
    if (sameEntries && isOfTwoTypes(path))
    {
        return "git keeps a link and a file apart";
    }
    if (sameEntries && isAddedWithTwoModes(path))
    {
        return "git and libgit2 choose between two modes of an added file";
    }
    if (renamed_.count(path) != 0 && areSidesAsTheyWere(library.entries))
    {
        return "git merges the sides of a renamed file under one name, libgit2 keeps them apart";
    }
    if (!sameEntries && isAnotherInEachBase(path))
    {
        return "git and libgit2 merge several merge bases to another one";
    }
    return {};
}

bool MergeExplanations::hasTwoFiles(const std::string &path) const
{
    const auto isFile = [&path](const Files &side)
    {
        const auto found = side.find(path);
        return found != side.end() && areOfOneType(found->second, plainMode);
    };
    return isFile(ours_) && isFile(theirs_);
}

MergeExplanations::Files MergeExplanations::listFiles(const GitRepository &repository,
                                                      const std::string &commit)
{
    Files files;
    for (const auto &record :
         split(repository.git({"ls-tree", "-r", "-z", "--full-tree", commit}), '\0'))
    {
        const auto tab = record.find('\t');
        std::string file = record.substr(0, tab);
        // "100644 blob <id>": the index does not tell the type.
        files.emplace(record.substr(tab + 1), file.erase(7, file.rfind(' ') - 6));
    }
    return files;
}

void MergeExplanations::addRenames(const GitRepository &repository, const std::string &base,
                                   const std::string &side)
{
    // Status, old name, new name.
    const auto fields = split(repository.git({"diff-tree", "-r", "-z", "--find-renames",
                                              "--diff-filter=R", "--name-status", base, side}),
                              '\0');
    for (std::size_t at = 0; at < fields.size(); at += 3)
        renamed_.insert({fields.at(at + 1), fields.at(at + 2)});
}

bool MergeExplanations::isFolderInTheWay(const std::string &path) const
{
    return (ours_.count(path) != 0 && holdsSomething(theirs_, path)) ||
           (theirs_.count(path) != 0 && holdsSomething(ours_, path));
}

bool MergeExplanations::isOfTwoTypes(const std::string &path) const
{
    const auto our = ours_.find(path);
    const auto their = theirs_.find(path);
    return our != ours_.end() && their != theirs_.end() &&
           !areOfOneType(our->second, their->second);
}

bool MergeExplanations::isAddedWithTwoModes(const std::string &path) const
{
    const auto our = ours_.find(path);
    const auto their = theirs_.find(path);
    return bases_.front().count(path) == 0 && our != ours_.end() && their != theirs_.end() &&
           our->second.substr(0, 6) != their->second.substr(0, 6);
}

bool MergeExplanations::areSidesAsTheyWere(const std::multiset<std::string> &entries) const
{
    return std::all_of(entries.begin(), entries.end(),
                       [this](const std::string &entry)
                       {
                           // "M 100644 <id> <stage>"
                           const std::string file = entry.substr(2, entry.size() - 4);
                           switch (entry.back())
                           {
                           case '1':
                               return std::any_of(bases_.begin(), bases_.end(),
                                                  [&file](const Files &base)
                                                  { return holdsFile(base, file); });
                           case '2':
                               return holdsFile(ours_, file);
                           case '3':
                               return holdsFile(theirs_, file);
                           default:
                               return false;
                           }
                       });
}

bool MergeExplanations::isRenamedOntoFolder(const std::string &path) const
{
    return renamed_.count(path) != 0 && isFolderInTheWay(path);
}

bool MergeExplanations::isAnotherInEachBase(const std::string &path) const
{
    return std::any_of(bases_.begin(), bases_.end(),
                       [&](const Files &base)
                       {
                           const auto one = base.find(path);
                           const auto first = bases_.front().find(path);
                           const bool isInOne = one != base.end();
                           const bool isInFirst = first != bases_.front().end();
                           return isInOne != isInFirst || (isInOne && one->second != first->second);
                       });
}

} // namespace vclink::test
