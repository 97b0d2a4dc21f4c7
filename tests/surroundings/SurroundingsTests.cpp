// SPDX-License-Identifier: MIT
#include <ostream>
#include <string>
#include <tuple>
#include <vector>

#include <gtest/gtest.h>

#include "Surroundings.hpp"

namespace
{

using namespace vclink::test;

const std::vector<std::string> mergeByGit{"merge", "--quiet", "--no-edit"};
const std::vector<std::string> forwardByGit{"merge", "--quiet", "--ff-only"};
const std::vector<std::string> switchByGit{"switch", "--quiet"};

BranchOperation amongFiles(const BranchOperation &operation, bool hasSiblings)
{
    BranchOperation result = operation;
    result.places = allPlaces;
    result.hasSiblings = hasSiblings;
    return result;
}

const std::vector<BranchOperation> operations{
    amongFiles({"merge", "ours", mergeByGit, mergeBranch, 0}, false),
    amongFiles({"fastForward", "main", forwardByGit, mergeBranch, 2}, false),
    amongFiles({"switch", "main", switchByGit, switchBranch, 1}, false),
    amongFiles({"merge", "ours", mergeByGit, mergeBranch, 1}, true),
    amongFiles({"fastForward", "main", forwardByGit, mergeBranch, 2}, true),
    amongFiles({"switch", "main", switchByGit, switchBranch, 2}, true)};

class FileSurroundings : public Surroundings
{
  protected:
    FileSurroundings(bool hasSiblings, Tree tree)
        : Surroundings(hasSiblings ? makeSurroundingsWithSiblings : makeSurroundings, tree)
    {
    }
};

class BranchSurroundings : public testing::WithParamInterface<std::tuple<BranchOperation, Tree>>,
                           public FileSurroundings
{
  protected:
    BranchSurroundings()
        : FileSurroundings(std::get<BranchOperation>(GetParam()).hasSiblings,
                           std::get<Tree>(GetParam()))
    {
    }
};

TEST_P(BranchSurroundings, LoseNothingThatGitKeepsAndOtherwiseDifferByRuleOnly)
{
    checkOperation(std::get<BranchOperation>(GetParam()), allObstacles());
}

std::string
nameOfOperation(const testing::TestParamInfo<std::tuple<BranchOperation, Tree>> &instance)
{
    const auto &[operation, tree] = instance.param;
    return operation.name + (operation.hasSiblings ? "BesideSiblings" : "") +
           testing::PrintToString(tree);
}

INSTANTIATE_TEST_SUITE_P(Operations, BranchSurroundings,
                         testing::Combine(testing::ValuesIn(operations), trees), nameOfOperation);

class RevertSurroundings : public testing::WithParamInterface<std::tuple<Listed, Tree>>,
                           public FileSurroundings
{
  protected:
    RevertSurroundings()
        : FileSurroundings(std::get<Listed>(GetParam()) == Listed::ObstacleAndSibling,
                           std::get<Tree>(GetParam()))
    {
    }
};

TEST_P(RevertSurroundings, LoseNothingThatGitKeepsAndOtherwiseDifferByRuleOnly)
{
    const Listed listed = std::get<Listed>(GetParam());
    checkReverts(listed == Listed::OtherFile ? "revert of another file" : "revert", listed, "other",
                 allPlaces(), allObstacles());
}

INSTANTIATE_TEST_SUITE_P(Lists, RevertSurroundings, allLists, nameOfList);

} // namespace
