// SPDX-License-Identifier: MIT
#include "ChangeSequence.hpp"

#include <algorithm>

#include <gtest/gtest.h>

#include "RandomContent.hpp"
#include "listedNames.hpp"

namespace vclink::test
{
namespace
{

bool isAnything(const GitFile & /*file*/)
{
    return true;
}

std::string folderOf(const std::string &path)
{
    const std::size_t slash = path.rfind('/');
    return slash == std::string::npos ? std::string() : path.substr(0, slash);
}

bool isBelowFile(const WorkingCopyMaker &tree, const std::string &folder)
{
    return !folder.empty() && (tree.isFile(folder) || isBelowFile(tree, folderOf(folder)));
}

} // namespace

ChangeSequence::ChangeSequence(std::uint64_t seed, const std::filesystem::path &folder)
    : random_(seed), twins_(folder)
{
}

void ChangeSequence::run()
{
    begin();
    for (std::size_t steps = 7 + random_.below(5); steps > 0; --steps)
    {
        for (std::size_t edits = random_.below(5); edits > 0; --edits)
        {
            edit();
        }
        change();
        if (testing::Test::HasFailure())
        {
            return;
        }
    }
    twins_.checkIntegrity();
}

void ChangeSequence::begin()
{
    std::vector<PlannedFile> files;
    const bool unborn = random_.chance(8);
    for (std::size_t count = 3 + random_.below(20); count > 0; --count)
    {
        const std::string path = freshPath();
        if (!path.empty())
        {
            files.push_back(planFile(path));
        }
    }
    twins_.begin(unborn ? std::vector<PlannedFile>() : files);
}

void ChangeSequence::change()
{
    const std::size_t kind = random_.below(100);
    if (kind < 15)
    {
        return add();
    }
    if (kind < 27)
    {
        return remove();
    }
    // Reverts meet conflicts only as long as a merge goes on.
    if (kind < 41 || (kind >= 80 && twins_.isMerging()))
    {
        return revert();
    }
    if (kind < 51)
    {
        return markResolved();
    }
    if (kind < 62 || !twins_.hasCommit() || twins_.isMerging())
    {
        return commit();
    }
    if (kind < 72)
    {
        return merge();
    }
    goOn();
}

void ChangeSequence::add()
{
    const Names untracked = listable([](const GitFile &file) { return file.untracked; });
    const bool someTracked = untracked.empty() || random_.chance(20);
    const Names names = pickSome(someTracked ? listable(isAnything) : untracked, 5);
    if (canBeStaged(names))
    {
        count("add", twins_.add(names));
    }
}

void ChangeSequence::remove()
{
    const bool deletedOnly = random_.chance(25);
    const Names names =
        listable([deletedOnly](const GitFile &file) { return !deletedOnly || file.index == 'D'; });
    count("remove", twins_.remove(pickSome(names, 4)));
}

void ChangeSequence::revert()
{
    const bool changedOnly = random_.chance(80);
    const Names names = pickSome(listable(
                                     [changedOnly](const GitFile &file) {
                                         return !changedOnly || file.index != '.' ||
                                                file.workTree != '.' || file.unmerged;
                                     }),
                                 6);
    if (canBeReverted(names))
    {
        count("revert", twins_.revert(names));
    }
}

void ChangeSequence::markResolved()
{
    Names names = listable([](const GitFile &file) { return file.unmerged; });
    if (names.empty() || random_.chance(20))
    {
        names = listable(isAnything);
    }
    const std::string name =
        names.empty() || random_.chance(20) ? somethingMade() : random_.pick(names);
    if (canBeStaged({name}))
    {
        count("markResolved", twins_.markResolved(name));
    }
}

void ChangeSequence::commit()
{
    static const Names messages{"",
                                "one line",
                                "one line\n",
                                "title\n\nbody\n# no comment\n",
                                "\n\n trailing \n\n",
                                "Z\xC3\xBCrich \xF0\x9D\x92\xB3"};
    const std::string change = twins_.isMerging() ? "commit of a merge" : "commit";
    count(change, twins_.commit(random_.pick(messages)));
}

/// Changes some files on a branch, partly the same ones here, and merges.
void ChangeSequence::merge()
{
    commit();
    Names files = committedFiles();
    std::vector<PlannedFile> aside;
    for (std::size_t count = 1 + random_.below(4); count > 0 && !files.empty(); --count)
    {
        const std::size_t index = random_.below(files.size());
        const std::string path = files[index];
        files.erase(files.begin() + static_cast<std::ptrdiff_t>(index));
        const std::string content = twins_.workingTree().read(path);
        const bool deleted = random_.chance(15);
        aside.push_back(
            {path, deleted ? "" : "100644", deleted ? "" : makeSimilar(random_, content)});
        if (random_.chance(70))
        {
            editFile(path);
        }
    }
    const std::string added = freshPath();
    if (!added.empty())
    {
        aside.push_back({added, "100644", makeContent(random_)});
    }
    const std::string branch = "aside" + std::to_string(++branches_);
    branchNames_.push_back(branch);
    twins_.branch(branch, aside);
    commit();
    const bool clean = twins_.merge(branch);
    count(clean ? "merge" : "merge with conflicts", {});
}

void ChangeSequence::goOn()
{
    const std::size_t kind = random_.below(4);
    if (kind == 0)
    {
        return count("switch", twins_.switchTo(random_.pick(branchNames_)));
    }
    const std::string branch = makeBranch();
    for (std::size_t edits = random_.below(4); edits > 0; --edits)
    {
        edit();
    }
    if (kind == 1)
    {
        return count("switch", twins_.switchTo(branch));
    }
    if (kind == 2)
    {
        return count("fast-forward", twins_.mergeByLibrary(branch));
    }
    const std::string path = freshPath();
    if (!path.empty())
    {
        write(path, makeContent(random_));
        twins_.add({path});
    }
    commit();
    for (std::size_t edits = random_.below(3); edits > 0; --edits)
    {
        edit();
    }
    count("merge by the library", twins_.mergeByLibrary(branch));
}

std::string ChangeSequence::makeBranch()
{
    std::vector<PlannedFile> files;
    for (std::size_t count = 1 + random_.below(4); count > 0; --count)
    {
        files.push_back(planInTheWay());
    }
    files.erase(std::remove_if(files.begin(), files.end(),
                               [](const PlannedFile &file) { return file.path.empty(); }),
                files.end());
    branchNames_.push_back("aside" + std::to_string(++branches_));
    twins_.branch(branchNames_.back(), files);
    return branchNames_.back();
}

PlannedFile ChangeSequence::planInTheWay()
{
    const Names names = listable(isAnything);
    std::string path = names.empty() || random_.chance(25) ? freshPath() : random_.pick(names);
    if (path.empty() || random_.chance(20))
    {
        return {path, path.empty() ? "100644" : "", ""};
    }
    if (random_.chance(10))
    {
        path += "/below";
    }
    else if (random_.chance(10) && !folderOf(path).empty())
    {
        path = folderOf(path);
    }
    return planFile(path);
}

void ChangeSequence::count(const std::string &change, const std::string &refusal)
{
    ++counts_[refusal.empty() ? change : change + ": " + refusal];
}

std::string ChangeSequence::freshPath()
{
    for (int attempt = 0; attempt < 10; ++attempt)
    {
        const std::string path = names_.fresh();
        const auto &tree = twins_.workingTree();
        if (isNoPattern(path) && tree.canHold(path) && !tree.exists(path))
        {
            return path;
        }
    }
    return {};
}

PlannedFile ChangeSequence::planFile(const std::string &path)
{
    if (random_.chance(8))
    {
        return {path, "120000", makeLinkTarget()};
    }
    return {path, random_.chance(85) ? "100644" : "100755", makeContent(random_)};
}

Names ChangeSequence::listable(const std::function<bool(const GitFile &file)> &isWanted)
{
    Names names;
    for (const auto &[path, file] : twins_.report())
    {
        if (isNoPattern(path) && isWanted(file))
        {
            names.push_back(path);
        }
    }
    return names;
}

std::string ChangeSequence::somethingMade()
{
    return made_.empty() || random_.chance(20) ? "neither here/nor there" : random_.pick(made_);
}

Names ChangeSequence::pickSome(const Names &names, std::size_t most)
{
    Names some;
    for (std::size_t count = names.empty() ? 0 : 1 + random_.below(most); count > 0; --count)
    {
        const std::string &name = random_.pick(names);
        const std::string folder = folderOf(name);
        some.push_back(!folder.empty() && random_.chance(10) ? folder : name);
    }
    if (random_.chance(10))
    {
        some.push_back(somethingMade());
    }
    return some;
}

bool ChangeSequence::hasIndexedBelow(const std::string &path)
{
    const auto &report = twins_.report();
    return std::any_of(report.begin(), report.end(),
                       [&path](const auto &entry)
                       { return isBelow(entry.first, path) && entry.second.indexMode != noMode; });
}

/// Leaves out files that have another file in the way: libgit2 fails for these. See
/// DifferencesFromGit.
bool ChangeSequence::canBeReverted(const Names &names)
{
    const auto &tree = twins_.workingTree();
    const Names resolved = resolveNames(tree.repository().path(), names);
    const auto &report = twins_.report();
    return std::none_of(report.begin(), report.end(),
                        [&](const auto &entry)
                        {
                            const std::string &path = entry.first;
                            return isMeant(path, resolved) && isBelowFile(tree, folderOf(path));
                        });
}

/// Leaves out files that take the place of a folder, if their names have to be escaped: these are
/// staged beside what the index has of the folder. See DifferencesFromGit.
bool ChangeSequence::canBeStaged(const Names &names)
{
    const Names resolved = resolveNames(twins_.workingTree().repository().path(), names);
    const auto &report = twins_.report();
    return std::none_of(report.begin(), report.end(),
                        [&](const auto &entry)
                        {
                            const auto &path = entry.first;
                            return isEscaped(path) && isMeant(path, resolved) &&
                                   hasIndexedBelow(path);
                        });
}

Names ChangeSequence::committedFiles()
{
    Names files =
        listable([](const GitFile &file) { return file.indexMode.compare(0, 3, "100") == 0; });
    files.erase(std::remove_if(files.begin(), files.end(),
                               [this](const std::string &path)
                               { return !twins_.workingTree().isFile(path); }),
                files.end());
    return files;
}

} // namespace vclink::test
