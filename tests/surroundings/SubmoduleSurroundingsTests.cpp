// SPDX-License-Identifier: MIT
#include <algorithm>
#include <string>
#include <tuple>
#include <vector>

#include <gtest/gtest.h>

#include "Surroundings.hpp"
#include "vclink/git/BranchManager.hpp"

namespace
{

namespace git = vclink::git;
using namespace vclink::test;

void switchThereAndBack(git::BranchManager &branches, const std::string &branch)
{
    branches.switchBranch(branch);
    branches.switchBranch("main");
}

BranchOperation besideSiblings(BranchOperation operation)
{
    operation.hasSiblings = true;
    return operation;
}

const std::vector<std::string> mergesByGit{"merge", "--quiet", "--no-edit"};
const std::vector<std::string> forwardsByGit{"merge", "--quiet", "--ff-only"};
const std::vector<std::string> switchesByGit{"switch", "--quiet"};
const std::vector<std::string> thereAndBackByGit{
    "-c", "alias.visit=!f() { git switch --quiet $1 && git switch --quiet main; }; f", "visit"};

/// A merge into a branch of ours that has changed the submodules, too.
BranchOperation mergeInto(const std::string &name, const std::string &start,
                          const std::vector<Place> &(*places)(),
                          const Change &begin = changesNothing,
                          const Change &clear = changesNothing)
{
    return {
        "merge into " + name, start, mergesByGit, mergeBranch, 1, {}, places, begin, false, clear};
}

const BranchOperation forward{"fast-forward of submodules", "main", forwardsByGit, mergeBranch, 2,
                              {"moves", "removes", "adds"}};
const BranchOperation thereAndBack{
    "switch of submodules and back", "main", thereAndBackByGit, switchThereAndBack, 2,
    {"removes", "renames", "adds"}};

const std::vector<BranchOperation> submoduleOperations{
    {"merge of submodules", "ours", mergesByGit, mergeBranch, 1},
    mergeInto("moved submodules", "ours-moves", movedSubmodulePlaces),
    mergeInto("added submodules", "ours-adds", addedSubmodulePlaces,
              runsGit({"submodule", "--quiet", "update", "--init", "new"})),
    // As after a clone; an obstacle puts a folder back.
    mergeInto("removed submodules", "ours-removes", removedSubmodulePlaces,
              removes("s") + removes("t/s")),
    mergeInto("replaced submodules", "ours-files", replacedSubmodulePlaces),
    // The submodule's own file would be in the way.
    mergeInto("unfolded submodules", "ours-folders", unfoldedSubmodulePlaces, changesNothing,
              runsGit({"submodule", "--quiet", "deinit", "s"})),
    forward,
    {"switch of submodules", "main", switchesByGit, switchBranch, 1},
    thereAndBack,
    besideSiblings({"merge of submodules", "ours", mergesByGit, mergeBranch, 2}),
    besideSiblings(forward),
    besideSiblings({"switch of submodules", "main", switchesByGit, switchBranch, 2}),
    besideSiblings(thereAndBack)};

/// The obstacles other than submodules that can matter to submodules.
const std::vector<std::string> otherObstacles{"untracked file",
                                              "ignored file",
                                              "link to a folder",
                                              "ignored link",
                                              "pipe",
                                              "untracked folder",
                                              "empty folder",
                                              "ignored folder",
                                              "repository",
                                              "staged new file",
                                              "edit",
                                              "missing",
                                              "staged edit",
                                              "folder in its place",
                                              "empty folder in its place",
                                              "file in the folder's place",
                                              "folder missing"};

class SubmoduleSurroundings : public Surroundings
{
  protected:
    SubmoduleSurroundings(bool hasSiblings, Tree tree)
        : Surroundings(
              hasSiblings ? makeSubmoduleSurroundingsWithSiblings : makeSubmoduleSurroundings, tree)
    {
        obstacles_ = submoduleObstacles();
        for (Obstacle obstacle : allObstacles())
        {
            if (std::count(otherObstacles.begin(), otherObstacles.end(), obstacle.name) == 0)
                continue;
            obstacle.isCommon = false;
            obstacles_.push_back(obstacle);
        }
    }

    std::vector<Obstacle> obstacles_;
};

class BranchesWithSubmodules
    : public testing::WithParamInterface<std::tuple<BranchOperation, Tree>>,
      public SubmoduleSurroundings
{
  protected:
    BranchesWithSubmodules()
        : SubmoduleSurroundings(std::get<BranchOperation>(GetParam()).hasSiblings,
                                std::get<Tree>(GetParam()))
    {
    }
};

TEST_P(BranchesWithSubmodules, LoseNothingThatGitKeepsAndOtherwiseDifferByRuleOnly)
{
    checkOperation(std::get<BranchOperation>(GetParam()), obstacles_);
}

std::string
nameOfSubmoduleOperation(const testing::TestParamInfo<std::tuple<BranchOperation, Tree>> &instance)
{
    const auto &[operation, tree] = instance.param;
    std::string name = testing::PrintToString(operation);
    std::replace_if(
        name.begin(), name.end(),
        [](char character) { return character == ' ' || character == '-'; }, '_');
    return name + testing::PrintToString(tree);
}

INSTANTIATE_TEST_SUITE_P(Operations, BranchesWithSubmodules,
                         testing::Combine(testing::ValuesIn(submoduleOperations), trees),
                         nameOfSubmoduleOperation);

class RevertsWithSubmodules : public testing::WithParamInterface<std::tuple<Listed, Tree>>,
                              public SubmoduleSurroundings
{
  protected:
    RevertsWithSubmodules()
        : SubmoduleSurroundings(std::get<Listed>(GetParam()) == Listed::ObstacleAndSibling,
                                std::get<Tree>(GetParam()))
    {
    }
};

TEST_P(RevertsWithSubmodules, LoseNothingThatGitKeepsAndOtherwiseDifferByRuleOnly)
{
    const Listed listed = std::get<Listed>(GetParam());
    checkReverts(listed == Listed::OtherFile ? "revert of a file beside submodules"
                                             : "revert of submodules",
                 listed, "mine", submodulePlaces(), obstacles_);
}

INSTANTIATE_TEST_SUITE_P(Lists, RevertsWithSubmodules, allLists, nameOfList);

} // namespace
