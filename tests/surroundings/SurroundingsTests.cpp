// SPDX-License-Identifier: MIT
#include <filesystem>
#include <ostream>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "Surroundings.hpp"
#include "support/text.hpp"
#include "vclink/git/BranchManager.hpp"

namespace
{

namespace fs = std::filesystem;
namespace git = vclink::git;
using vclink::test::asPath;
using vclink::test::GitRepository;
using vclink::test::Holds;
using vclink::test::Place;
using vclink::test::Surroundings;

/// An operation, by the library and by git, on a working copy that is on the branch `start`.
struct Operation
{
    std::string name;
    std::string start;
    std::vector<std::string> byGit;
    void (*byLibrary)(git::BranchManager &branches, const std::string &branch);
    /// of place and obstacle, how many have to be common
    int commonOnes;
    bool hasSiblings = false;
};

std::ostream &operator<<(std::ostream &stream, const Operation &operation)
{
    return stream << operation.name << (operation.hasSiblings ? "BesideSiblings" : "");
}

void mergeBranch(git::BranchManager &branches, const std::string &branch)
{
    branches.merge(branch);
}

void switchBranch(git::BranchManager &branches, const std::string &branch)
{
    branches.switchBranch(branch);
}

const std::vector<Operation> operations{
    {"merge", "ours", {"merge", "--quiet", "--no-edit"}, mergeBranch, 0},
    {"fastForward", "main", {"merge", "--quiet", "--ff-only"}, mergeBranch, 2},
    {"switch", "main", {"switch", "--quiet"}, switchBranch, 1},
    {"merge", "ours", {"merge", "--quiet", "--no-edit"}, mergeBranch, 1, true},
    {"fastForward", "main", {"merge", "--quiet", "--ff-only"}, mergeBranch, 2, true},
    {"switch", "main", {"switch", "--quiet"}, switchBranch, 2, true}};

class FileSurroundings : public Surroundings
{
  protected:
    explicit FileSurroundings(bool hasSiblings)
        : Surroundings(hasSiblings ? vclink::test::makeSurroundingsWithSiblings
                                   : vclink::test::makeSurroundings)
    {
    }
};

class BranchSurroundings : public testing::WithParamInterface<Operation>, public FileSurroundings
{
  protected:
    BranchSurroundings() : FileSurroundings(GetParam().hasSiblings)
    {
    }
};

TEST_P(BranchSurroundings, LoseNothingThatGitKeepsAndOtherwiseDifferByRuleOnly)
{
    const Operation &operation = GetParam();
    go(operation.start);
    for (const auto &place : vclink::test::allPlaces())
    {
        for (const auto &obstacle : vclink::test::allObstacles())
        {
            const int commonOnes = int{place.isCommon} + int{obstacle.isCommon};
            if (obstacle.place != place.holds || commonOnes < operation.commonOnes ||
                (operation.hasSiblings && !hasSibling(place)))
                continue;
            auto byGit = operation.byGit;
            byGit.push_back(place.branch);
            const auto byLibrary = [&](const fs::path &copy)
            {
                return outcomeOf(obstacle,
                                 [&]
                                 {
                                     const auto adapter = makeAdapter(copy);
                                     operation.byLibrary(*git::BranchManager::create(*adapter),
                                                         place.branch);
                                 });
            };
            check({{operation.name, obstacle.name, place.name, "", "", operation.hasSiblings},
                   obstacle,
                   place,
                   byGit,
                   byLibrary});
        }
    }
    conclude(operation.name, operation.hasSiblings);
}

INSTANTIATE_TEST_SUITE_P(Operations, BranchSurroundings, testing::ValuesIn(operations),
                         testing::PrintToStringParamName());

enum class Listed
{
    OtherFile,
    Obstacle,
    ObstacleAndSibling
};

class RevertSurroundings : public testing::WithParamInterface<Listed>, public FileSurroundings
{
  protected:
    RevertSurroundings() : FileSurroundings(GetParam() == Listed::ObstacleAndSibling)
    {
    }
    /// What a revert names in a place: a folder, by a file below it.
    static std::string nameIn(const Place &place)
    {
        return place.holds == Holds::Folder ? place.path + "/file" : place.path;
    }
};

TEST_P(RevertSurroundings, LoseNothingThatGitKeepsAndOtherwiseDifferByRuleOnly)
{
    const bool isListed = GetParam() != Listed::OtherFile;
    const bool hasSiblings = GetParam() == Listed::ObstacleAndSibling;
    const std::string operation = isListed ? "revert" : "revert of another file";
    go("main");
    for (const auto &place : vclink::test::allPlaces())
    {
        for (const auto &obstacle : vclink::test::allObstacles())
        {
            const bool isWorthwhile =
                hasSiblings ? hasSibling(place) : isListed || obstacle.isCommon;
            if (obstacle.place != place.holds || place.branch != "unrelated" || !isWorthwhile)
                continue;
            std::vector<std::string> byGit{
                "restore", "--source=HEAD", "--staged", "--worktree", "--ignore-skip-worktree-bits",
                "other"};
            std::vector<std::string> names{"other"};
            if (isListed)
            {
                names.push_back(nameIn(place));
                // git refuses names of what is in no commit and not in the index.
                if (place.holds != Holds::Nothing || obstacle.name.find("staged") == 0)
                    byGit.push_back(nameIn(place));
            }
            const std::string sibling = vclink::test::siblingOf(place.path);
            if (hasSiblings)
            {
                byGit.push_back(sibling);
                names.push_back(sibling);
            }
            const auto byLibrary = [&](const fs::path &copy)
            {
                return outcomeOf(obstacle,
                                 [&]
                                 {
                                     std::vector<upath> paths;
                                     for (const auto &name : names)
                                         paths.push_back(asPath((copy / name).string()));
                                     makeAdapter(copy)->revertFiles(paths);
                                 });
            };
            check({{operation, obstacle.name, place.name, "", "", hasSiblings},
                   obstacle,
                   place,
                   byGit,
                   byLibrary,
                   [&](const GitRepository &copy)
                   {
                       copy.remove("other");
                       if (hasSiblings)
                           copy.write(sibling, "edited\n");
                   }});
        }
    }
    conclude(operation, hasSiblings);
}

INSTANTIATE_TEST_SUITE_P(Lists, RevertSurroundings,
                         testing::Values(Listed::Obstacle, Listed::OtherFile,
                                         Listed::ObstacleAndSibling),
                         [](const auto &instance)
                         {
                             const bool isListed = instance.param != Listed::OtherFile;
                             const bool hasSiblings = instance.param == Listed::ObstacleAndSibling;
                             return hasSiblings ? "OfWhatIsInTheWayAndSiblings"
                                    : isListed  ? "OfWhatIsInTheWay"
                                                : "OfAnotherFile";
                         });

} // namespace
