// SPDX-License-Identifier: MIT
#include <ostream>
#include <string>
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
    explicit FileSurroundings(bool hasSiblings)
        : Surroundings(hasSiblings ? makeSurroundingsWithSiblings : makeSurroundings)
    {
    }
};

class BranchSurroundings : public testing::WithParamInterface<BranchOperation>,
                           public FileSurroundings
{
  protected:
    BranchSurroundings() : FileSurroundings(GetParam().hasSiblings)
    {
    }
};

TEST_P(BranchSurroundings, LoseNothingThatGitKeepsAndOtherwiseDifferByRuleOnly)
{
    checkOperation(GetParam(), allObstacles());
}

INSTANTIATE_TEST_SUITE_P(Operations, BranchSurroundings, testing::ValuesIn(operations),
                         [](const auto &instance) {
                             return instance.param.name +
                                    (instance.param.hasSiblings ? "BesideSiblings" : "");
                         });

class RevertSurroundings : public testing::WithParamInterface<Listed>, public FileSurroundings
{
  protected:
    RevertSurroundings() : FileSurroundings(GetParam() == Listed::ObstacleAndSibling)
    {
    }
};

TEST_P(RevertSurroundings, LoseNothingThatGitKeepsAndOtherwiseDifferByRuleOnly)
{
    checkReverts(GetParam() == Listed::OtherFile ? "revert of another file" : "revert", GetParam(),
                 "other", allPlaces(), allObstacles());
}

INSTANTIATE_TEST_SUITE_P(Lists, RevertSurroundings,
                         testing::Values(Listed::Obstacle, Listed::OtherFile,
                                         Listed::ObstacleAndSibling),
                         testing::PrintToStringParamName());

} // namespace
