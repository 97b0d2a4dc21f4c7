// SPDX-License-Identifier: MIT
#include "Surroundings.hpp"

#include <algorithm>
#include <cstdlib>
#include <exception>
#include <fstream>
#include <iostream>
#include <utility>

#include <gtest/gtest.h>

#include "support/ChildProcess.hpp"
#include "support/adapterFor.hpp"
#include "support/text.hpp"

namespace vclink::test
{
namespace
{

namespace fs = std::filesystem;

constexpr std::chrono::seconds patience{5};

const std::string goesThrough = "goes through";
const std::string refuses = "refuses";

Snapshot look(const fs::path &folder)
{
    return takeSnapshot(folder / "copy", folder);
}

bool contains(const std::vector<std::string> &names, const std::string &name)
{
    return std::find(names.begin(), names.end(), name) != names.end();
}

std::string describe(bool isDone, const Snapshot &after)
{
    if (isDone)
        return goesThrough;
    return after.underWay.count("MERGE_HEAD") == 1 ? "stops in conflicts" : refuses;
}

} // namespace

std::ostream &operator<<(std::ostream &stream, const BranchOperation &operation)
{
    return stream << operation.name << (operation.hasSiblings ? " beside siblings" : "");
}

void mergeBranch(git::BranchManager &branches, const std::string &branch)
{
    branches.merge(branch);
}

void switchBranch(git::BranchManager &branches, const std::string &branch)
{
    branches.switchBranch(branch);
}

std::ostream &operator<<(std::ostream &stream, Listed listed)
{
    return stream << (listed == Listed::OtherFile  ? "OfAnotherFile"
                      : listed == Listed::Obstacle ? "OfWhatIsInTheWay"
                                                   : "OfWhatIsInTheWayAndSiblings");
}

std::ostream &operator<<(std::ostream &stream, Tree tree)
{
    return stream << (tree == Tree::Linked ? "InALinkedTree" : "");
}

std::string nameOfList(const testing::TestParamInfo<std::tuple<Listed, Tree>> &instance)
{
    const auto &[listed, tree] = instance.param;
    return testing::PrintToString(listed) + testing::PrintToString(tree);
}

Surroundings::Surroundings(void (*make)(const fs::path &folder), Tree tree)
    : tree_(tree), isWhole_(tree == Tree::Main || std::getenv("VCLINK_ALL_SITUATIONS") != nullptr)
{
    std::ofstream(environment().home() / ".gitconfig")
        << "[user]\n\tname = Somebody\n\temail = somebody@example.com\n";
    make(original_);
    if (tree == Tree::Linked)
        linkSurroundings(original_);
}

void Surroundings::go(const std::string &branch)
{
    original().git({"switch", "--quiet", branch});
    committed_ = committedContents(original_ / "copy");
}

void Surroundings::checkOperation(const BranchOperation &operation,
                                  const std::vector<Obstacle> &obstacles)
{
    operation.clear(original());
    go(operation.start);
    operation.begin(original());
    for (const auto &place : operation.places())
    {
        for (const auto &obstacle : obstacles)
        {
            const int commonOnes = int{place.isCommon} + int{obstacle.isCommon};
            const bool isLeftOut =
                (!operation.branches.empty() && !contains(operation.branches, place.branch)) ||
                (operation.hasSiblings && !hasSibling(place));
            if (!isWanted(obstacle, place, obstacles) || commonOnes < operation.commonOnes ||
                isLeftOut)
                continue;
            auto byGit = operation.byGit;
            byGit.push_back(place.branch);
            const auto operate = [&](CMAdapter &adapter, const fs::path &)
            { operation.byLibrary(*git::BranchManager::create(adapter), place.branch); };
            check({{operation.name, obstacle.name, place.name, "", "", operation.hasSiblings},
                   obstacle,
                   place,
                   byGit,
                   operate});
        }
    }
    conclude(operation.name, operation.hasSiblings);
}

void Surroundings::checkReverts(const std::string &operation, Listed listed,
                                const std::string &missing, const std::vector<Place> &places,
                                const std::vector<Obstacle> &obstacles)
{
    const bool hasSiblings = listed == Listed::ObstacleAndSibling;
    go("main");
    for (const auto &place : places)
    {
        for (const auto &obstacle : obstacles)
        {
            const bool isWorthwhile =
                hasSiblings ? hasSibling(place) : listed == Listed::Obstacle || obstacle.isCommon;
            if (!isWanted(obstacle, place, obstacles) || place.branch != "unrelated" ||
                !isWorthwhile)
                continue;
            std::vector<std::string> names{missing};
            std::vector<std::string> byGit{
                "restore", "--source=HEAD", "--staged", "--worktree", "--ignore-skip-worktree-bits",
                missing};
            if (listed != Listed::OtherFile)
            {
                // A folder is named by a file below it.
                names.push_back(place.path + (place.holds == Holds::Folder ? "/file" : ""));
                // git refuses names of what is in no commit and not in the index.
                if (place.holds != Holds::Nothing || obstacle.name.find("staged") == 0)
                    byGit.push_back(names.back());
            }
            const std::string sibling = siblingOf(place.path);
            if (hasSiblings)
            {
                byGit.push_back(sibling);
                names.push_back(sibling);
            }
            const auto revert = [&](CMAdapter &adapter, const fs::path &copy)
            {
                std::vector<upath> paths;
                for (const auto &name : names)
                    paths.push_back(asPath((copy / name).string()));
                adapter.revertFiles(paths);
            };
            const Change edit = hasSiblings ? writes(sibling, "edited\n") : changesNothing;
            check({{operation, obstacle.name, place.name, "", "", hasSiblings},
                   obstacle,
                   place,
                   byGit,
                   revert,
                   removes(missing) + edit});
        }
    }
    conclude(operation, hasSiblings);
}

bool Surroundings::isWanted(const Obstacle &obstacle, const Place &place,
                            const std::vector<Obstacle> &obstacles) const
{
    const auto isCommonOne = [&place](const Obstacle &other)
    { return other.isCommon && other.place == place.holds; };
    const bool isCommon =
        obstacle.isCommon || std::none_of(obstacles.begin(), obstacles.end(), isCommonOne);
    return obstacle.place == place.holds && (isWhole_ || (isCommon && place.isCommon));
}

void Surroundings::check(const Cell &cell)
{
    const std::string name = cell.situation.operation + ": " + cell.obstacle.name + ", " +
                             cell.place.name + " (" + cell.place.path + ')' +
                             (cell.situation.hasSiblings ? " beside a sibling" : "") +
                             (tree_ == Tree::Linked ? " in a linked tree" : "");
    const char *const wanted = std::getenv("VCLINK_CELL");
    if (wanted != nullptr && name.find(wanted) == std::string::npos)
        return;
    ++cells_;
    SCOPED_TRACE(name);
    try
    {
        compare(cell);
    }
    catch (const std::exception &exception)
    {
        ADD_FAILURE() << exception.what();
    }
    for (const auto *side : {"library", "git"})
        fs::remove_all(folder() / side);
}

bool Surroundings::hasSibling(const Place &place) const
{
    return fs::exists(original_ / "copy" / siblingOf(place.path));
}

void Surroundings::conclude(const std::string &operation, bool hasSiblings) const
{
    std::cout << cells_ << " situations of " << operation << (hasSiblings ? " beside siblings" : "")
              << (tree_ == Tree::Linked ? " in a linked tree" : "") << '\n';
    for (const auto &[outcome, count] : outcomes_)
        std::cout << "  " << count << " x " << outcome << '\n';
    if (std::getenv("VCLINK_CELL") != nullptr)
        return;
    EXPECT_GE(cells_, 1);
    if (!isWhole_)
        return;
    const bool isLarge = !hasSiblings && (operation == "merge" || operation == "switch");
    EXPECT_GE(cells_, isLarge ? 200 : 7);
    for (const auto &difference : surroundingDifferences())
    {
        // Beside siblings there are fewer situations, which need not meet the others.
        if (hasSiblings != difference.isOfSiblings)
            continue;
        const auto &names = difference.operations;
        const bool isMeant = std::count(names.begin(), names.end(), operation) == 1;
        EXPECT_EQ(met_.count(&difference), isMeant ? 1U : 0U)
            << difference.reason << " in " << difference.place;
    }
}

std::string Surroundings::outcomeByLibrary(const Cell &cell, const fs::path &copy)
{
    const auto textOf = [&]() -> std::string
    {
        try
        {
            cell.byLibrary(*adapterFor(GitRepository(copy)), copy);
            return {};
        }
        catch (const std::exception &exception)
        {
            return std::string("raised ") + exception.what();
        }
    };
    return cell.obstacle.mayBlock ? runInChild(textOf, patience) : textOf();
}

fs::path Surroundings::makeTwin(const Cell &cell, const std::string &side, bool isObstructed)
{
    const fs::path path = folder() / side;
    copySurroundings(original_, path);
    const GitRepository copy(path / "copy");
    if (isObstructed)
        cell.obstacle.put(copy, cell.place.path);
    else
        cell.place.giveWay(copy);
    cell.prepare(copy);
    return path;
}

void Surroundings::compare(const Cell &cell)
{
    const fs::path library = makeTwin(cell, "library");
    const fs::path git = makeTwin(cell, "git");
    const Snapshot before = look(library);

    const std::string raised = outcomeByLibrary(cell, library / "copy");
    const auto byGit = GitRepository(git / "copy").command(cell.byGit).timeout(patience).run();
    EXPECT_FALSE(byGit.timedOut);

    const Snapshot after = look(library);
    const Snapshot afterGit = look(git);
    const std::string difference = differenceOf(afterGit, after);
    Comparand comparand = cell.situation;
    comparand.git = describe(byGit.succeeded(), afterGit);
    comparand.library = describe(raised.empty(), after);
    const bool isRefused = comparand.library == refuses;
    if (comparand.git == comparand.library && !isRefused && !difference.empty())
        comparand.library = "leaves something else";
    ++outcomes_["git " + comparand.git + ", the library " + comparand.library];

    for (const auto &id : lostFrom(before, after, library))
        EXPECT_TRUE(comparand.git != refuses && lostFrom(before, afterGit, git).count(id) == 1)
            << id << " is lost";
    EXPECT_TRUE(comparand.git == comparand.library || isExplained(comparand))
        << "git " << comparand.git << ", the library " << comparand.library << '\n'
        << byGit.errors << raised << '\n'
        << (comparand.library == "leaves something else" ? difference : "");
    if (isRefused)
    {
        EXPECT_EQ(changeOf(before, after), "") << "refused with " << raised;
        if (!isForSiblings(comparand))
            expectWorksWithoutObstacle(cell, library);
    }
}

std::set<std::string> Surroundings::lostFrom(const Snapshot &before, const Snapshot &after,
                                             const fs::path &folder) const
{
    std::set<std::string> contents = before.indexIds;
    for (const auto &[name, id] : before.fileIds)
        contents.insert(id);
    for (const auto &id : committed_)
        contents.erase(id);
    return lostOf(std::move(contents), after, folder / "copy");
}

void Surroundings::expectWorksWithoutObstacle(const Cell &cell, const fs::path &library)
{
    clearSurroundings(original_, library);
    cell.place.giveWay(GitRepository(library / "copy"));
    cell.prepare(GitRepository(library / "copy"));
    const std::string raised = outcomeByLibrary(cell, library / "copy");
    const Snapshot after = look(library);
    EXPECT_NE(describe(raised.empty(), after), refuses)
        << raised << " though nothing is in the way any more";
    std::string key = cell.place.path;
    for (const auto &argument : cell.byGit)
        key += ' ' + argument;
    if (references_.count(key) == 0)
    {
        const fs::path reference = makeTwin(cell, "reference", false);
        GitRepository(reference / "copy").tryGit(cell.byGit);
        references_[key] = look(reference);
        fs::remove_all(reference);
    }
    if (raised.empty())
    {
        EXPECT_EQ(differenceOf(references_[key], after), "");
    }
}

bool Surroundings::isForSiblings(const Comparand &comparand)
{
    const auto &all = surroundingDifferences();
    return std::any_of(all.begin(), all.end(),
                       [&comparand](const SurroundingDifference &difference)
                       {
                           return difference.isOfSiblings && difference.obstacles.empty() &&
                                  difference.isAbout(comparand);
                       });
}

bool Surroundings::isExplained(const Comparand &comparand)
{
    bool isMet = false;
    for (const auto &difference : surroundingDifferences())
    {
        if (!difference.explains(comparand))
            continue;
        met_.insert(&difference);
        isMet = true;
    }
    return isMet;
}

} // namespace vclink::test
