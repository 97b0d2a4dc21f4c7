// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>
#include <filesystem>
#include <functional>
#include <map>
#include <memory>
#include <set>
#include <string>
#include <vector>

#include "Situation.hpp"
#include "differential/Snapshot.hpp"
#include "support/GitFixture.hpp"
#include "support/LibGit2Session.hpp"
#include "surroundingDifferences.hpp"
#include "vclink/CMAdapter.hpp"

namespace vclink::test
{

/// Every obstacle in every place, for one operation: the library in one working copy, git in its
/// twin. VCLINK_CELL names a part of the situations to look at alone, as they are printed.
class Surroundings : public GitFixture
{
  protected:
    /// @param make makes what the twins are copies of
    explicit Surroundings(void (*make)(const std::filesystem::path &folder));

    void go(const std::string &branch);
    /// The working copy that the twins are copies of.
    GitRepository original() const
    {
        return GitRepository(original_ / "copy");
    }

    struct Cell
    {
        Comparand situation;
        const Obstacle &obstacle;
        const Place &place;
        std::vector<std::string> byGit;
        /// @return what was thrown
        std::function<std::string(const std::filesystem::path &copy)> byLibrary;
        std::function<void(const GitRepository &copy)> prepare = [](const GitRepository &) {};
    };

    void check(const Cell &cell);
    /// Says what the situations came to, and expects that each difference has been met.
    void conclude(const std::string &operation, bool hasSiblings = false) const;
    /// Whether there is something else to look at beside siblings.
    bool hasSibling(const Place &place) const;

    static std::string outcomeOf(const Obstacle &obstacle, const std::function<void()> &action);
    static std::unique_ptr<CMAdapter> makeAdapter(const std::filesystem::path &copy);

  private:
    std::filesystem::path makeTwin(const Cell &cell, const std::string &side,
                                   bool isObstructed = true);
    void compare(const Cell &cell);
    /// What was the user's and is neither in the files, nor in the index or a commit.
    std::set<std::string> lostFrom(const Snapshot &before, const Snapshot &after,
                                   const std::filesystem::path &folder) const;
    void expectWorksWithoutObstacle(const Cell &cell, const std::filesystem::path &library);
    bool isExplained(const Comparand &comparand);
    /// Whether it may be the siblings that are in the way, and not the obstacle.
    static bool isForSiblings(const Comparand &comparand);

    LibGit2Session session_{environment()};
    const std::filesystem::path original_ = folder() / "original";
    std::set<std::string> committed_;
    std::map<std::string, Snapshot> references_;
    std::set<const SurroundingDifference *> met_;
    std::map<std::string, int> outcomes_;
    int cells_ = 0;
};

} // namespace vclink::test
