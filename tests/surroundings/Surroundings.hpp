// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>
#include <filesystem>
#include <functional>
#include <iosfwd>
#include <map>
#include <set>
#include <string>
#include <tuple>
#include <vector>

#include <gtest/gtest.h>

#include "Situation.hpp"
#include "differential/Snapshot.hpp"
#include "support/Change.hpp"
#include "support/GitFixture.hpp"
#include "support/LibGit2Session.hpp"
#include "surroundingDifferences.hpp"
#include "vclink/CMAdapter.hpp"
#include "vclink/git/BranchManager.hpp"

namespace vclink::test
{

/// An operation on branches, by the library and by git, on a working copy that is on `start`.
struct BranchOperation
{
    std::string name;
    std::string start;
    std::vector<std::string> byGit;
    void (*byLibrary)(git::BranchManager &branches, const std::string &branch);
    /// of place and obstacle, how many have to be common
    int commonOnes;
    /// none for all
    std::vector<std::string> branches{};
    const std::vector<Place> &(*places)() = submodulePlaces;
    /// Completes what a switch to the branch `start` has left.
    Change begin = changesNothing;
    bool hasSiblings = false;
    /// Lets git switch to the branch `start`.
    Change clear = changesNothing;
};

std::ostream &operator<<(std::ostream &stream, const BranchOperation &operation);

void mergeBranch(git::BranchManager &branches, const std::string &branch);
void switchBranch(git::BranchManager &branches, const std::string &branch);

/// Which working tree the operation is in.
enum class Tree
{
    Main,
    Linked
};

/// What follows the name of a test.
std::ostream &operator<<(std::ostream &stream, Tree tree);

/// What is in the list of a revert.
enum class Listed
{
    OtherFile,
    Obstacle,
    ObstacleAndSibling
};

std::ostream &operator<<(std::ostream &stream, Listed listed);

/// Parameters of the suites.
inline const auto trees = testing::Values(Tree::Main, Tree::Linked);
inline const auto allLists = testing::Combine(
    testing::Values(Listed::Obstacle, Listed::OtherFile, Listed::ObstacleAndSibling), trees);

/// Names a test of a suite of reverts.
std::string nameOfList(const testing::TestParamInfo<std::tuple<Listed, Tree>> &instance);

/// Every obstacle in every place, for one operation: the library in one working copy, git in its
/// twin. In a linked working tree, only common places, with the common obstacles or, if there are
/// none, with all; VCLINK_ALL_SITUATIONS lifts this limit. VCLINK_CELL names a part of the
/// situations to look at alone, as they are printed.
class Surroundings : public GitFixture
{
  protected:
    /// @param make makes what the twins are copies of
    Surroundings(void (*make)(const std::filesystem::path &folder), Tree tree);

    void go(const std::string &branch);
    /// The working copy that the twins are copies of.
    GitRepository original() const
    {
        return GitRepository(original_ / "copy");
    }

    /// Each of these obstacles in the places of the operation.
    void checkOperation(const BranchOperation &operation, const std::vector<Obstacle> &obstacles);
    /// Reverts on main of a file that is missing, and of what is listed beside it.
    void checkReverts(const std::string &operation, Listed listed, const std::string &missing,
                      const std::vector<Place> &places, const std::vector<Obstacle> &obstacles);

  private:
    struct Cell
    {
        Comparand situation;
        const Obstacle &obstacle;
        const Place &place;
        std::vector<std::string> byGit;
        std::function<void(CMAdapter &adapter, const std::filesystem::path &copy)> byLibrary;
        Change prepare = changesNothing;
    };

    bool isWanted(const Obstacle &obstacle, const Place &place,
                  const std::vector<Obstacle> &obstacles) const;
    void check(const Cell &cell);
    /// Says what the situations came to, and expects that each difference has been met.
    void conclude(const std::string &operation, bool hasSiblings = false) const;
    /// Whether there is something else to look at beside siblings.
    bool hasSibling(const Place &place) const;
    /// @return what was thrown
    static std::string outcomeByLibrary(const Cell &cell, const std::filesystem::path &copy);
    std::filesystem::path makeTwin(const Cell &cell, const std::string &side,
                                   bool isObstructed = true);
    void compare(const Cell &cell);
    /// What was the user's and is neither in the files, nor in the index or a commit.
    std::set<std::string> lostFrom(const Snapshot &before, const Snapshot &after,
                                   const std::filesystem::path &folder) const;
    void expectWorksWithoutObstacle(const Cell &cell, const std::filesystem::path &library);
    bool isExplained(const Comparand &comparand);
    /// Whether the siblings alone are in the way, whatever the obstacle is.
    static bool isForSiblings(const Comparand &comparand);

    LibGit2Session session_{environment()};
    const Tree tree_;
    const bool isWhole_;
    const std::filesystem::path original_ = folder() / "original";
    std::set<std::string> committed_;
    std::map<std::string, Snapshot> references_;
    std::set<const SurroundingDifference *> met_;
    std::map<std::string, int> outcomes_;
    int cells_ = 0;
};

} // namespace vclink::test
