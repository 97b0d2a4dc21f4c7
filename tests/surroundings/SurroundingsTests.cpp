// SPDX-License-Identifier: MIT
#include <algorithm>
#include <chrono>
#include <cstdlib>
#include <exception>
#include <filesystem>
#include <fstream>
#include <iostream>
#include <map>
#include <memory>
#include <set>
#include <string>
#include <utility>
#include <vector>

#include <gtest/gtest.h>

#include "Situation.hpp"
#include "differential/Snapshot.hpp"
#include "support/ChildProcess.hpp"
#include "support/GitTest.hpp"
#include "support/LibGit2Session.hpp"
#include "support/TestInteractor.hpp"
#include "support/text.hpp"
#include "surroundingDifferences.hpp"
#include "vclink/git/BranchManager.hpp"
#include "vclink/git/GitAdapterFactory.hpp"

namespace
{

namespace fs = std::filesystem;
namespace git = vclink::git;
using vclink::test::asPath;
using vclink::test::Comparand;
using vclink::test::GitRepository;
using vclink::test::Holds;
using vclink::test::Obstacle;
using vclink::test::Place;
using vclink::test::Snapshot;

constexpr std::chrono::seconds patience{5};

const std::string goesThrough = "goes through";
const std::string refuses = "refuses";

/// An operation, by the library and by git, on a working copy that is on the branch `start`.
struct Operation
{
    std::string name;
    std::string start;
    std::vector<std::string> byGit;
    void (*byLibrary)(git::BranchManager &branches, const std::string &branch);
    /// of place and obstacle, how many have to be common
    int commonOnes;
};

std::ostream &operator<<(std::ostream &stream, const Operation &operation)
{
    return stream << operation.name;
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
    {"switch", "main", {"switch", "--quiet"}, switchBranch, 1}};

/// Every obstacle in every place, for one operation: the library in one working copy, git in its
/// twin. VCLINK_CELL names a part of the situations to look at alone, as they are printed.
class Surroundings : public vclink::test::GitTest
{
  protected:
    Surroundings()
    {
        std::ofstream(environment().home() / ".gitconfig")
            << "[user]\n\tname = Somebody\n\temail = somebody@example.com\n";
        vclink::test::makeSurroundings(original_);
    }

    void go(const std::string &branch)
    {
        GitRepository(original_ / "copy").git({"switch", "--quiet", branch});
        committed_ = vclink::test::committedContents(original_ / "copy");
    }

    struct Cell
    {
        Comparand situation;
        const Obstacle &obstacle;
        const Place &place;
        std::vector<std::string> byGit;
        /// @return what was raised
        std::function<std::string(const fs::path &copy)> byLibrary;
        std::function<void(const GitRepository &copy)> prepare = [](const GitRepository &) {};
    };

    void check(const Cell &cell)
    {
        const std::string name = cell.situation.operation + ": " + cell.obstacle.name + ", " +
                                 cell.place.name + " (" + cell.place.path + ')';
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

    void conclude(const std::string &operation) const
    {
        std::cout << cells_ << " situations of " << operation << '\n';
        for (const auto &[outcome, count] : outcomes_)
            std::cout << "  " << count << " x " << outcome << '\n';
        if (std::getenv("VCLINK_CELL") != nullptr)
            return;
        for (const auto &difference : vclink::test::surroundingDifferences())
        {
            const auto &names = difference.operations;
            const bool isMeant = std::count(names.begin(), names.end(), operation) == 1;
            EXPECT_EQ(met_.count(&difference), isMeant ? 1U : 0U)
                << difference.reason << " in " << difference.place;
        }
    }

    static std::string outcomeOf(const Obstacle &obstacle, const std::function<void()> &action)
    {
        const auto textOf = [&action]() -> std::string
        {
            try
            {
                action();
                return {};
            }
            catch (const std::exception &exception)
            {
                return std::string("raised ") + exception.what();
            }
        };
        return obstacle.mayBlock ? vclink::test::runInChild(textOf, patience) : textOf();
    }
    static std::unique_ptr<vclink::CMAdapter> makeAdapter(const fs::path &copy)
    {
        return git::GitAdapterFactory().createAdapterFor(
            asPath(copy.string()), std::make_shared<vclink::test::TestInteractor>());
    }

  private:
    fs::path makeTwin(const Cell &cell, const std::string &side, bool isObstructed = true)
    {
        const fs::path path = folder() / side;
        vclink::test::copySurroundings(original_, path);
        const GitRepository copy(path / "copy");
        if (isObstructed)
            cell.obstacle.put(copy, cell.place.path);
        cell.prepare(copy);
        return path;
    }

    void compare(const Cell &cell)
    {
        const fs::path library = makeTwin(cell, "library");
        const fs::path git = makeTwin(cell, "git");
        const Snapshot before = look(library);

        const std::string raised = cell.byLibrary(library / "copy");
        const auto byGit = GitRepository(git / "copy").command(cell.byGit).timeout(patience).run();
        EXPECT_FALSE(byGit.timedOut);

        const Snapshot after = look(library);
        const Snapshot afterGit = look(git);
        const std::string difference = vclink::test::differenceOf(afterGit, after);
        const bool isRefused = !raised.empty();
        Comparand comparand = cell.situation;
        comparand.git = byGit.succeeded() ? goesThrough : refuses;
        comparand.library = isRefused ? refuses : goesThrough;
        if (byGit.succeeded() && !isRefused && !difference.empty())
            comparand.library = "leaves something else";
        ++outcomes_["git " + comparand.git + ", the library " + comparand.library];

        for (const auto &id : lostFrom(before, after, library))
            EXPECT_TRUE(byGit.succeeded() && lostFrom(before, afterGit, git).count(id) == 1)
                << id << " is lost";
        EXPECT_TRUE(comparand.git == comparand.library || isExplained(comparand))
            << "git " << comparand.git << ", the library " << comparand.library << '\n'
            << byGit.errors << raised << '\n'
            << (comparand.library == "leaves something else" ? difference : "");
        if (isRefused)
        {
            EXPECT_EQ(vclink::test::changeOf(before, after), "") << "refused with " << raised;
            expectWorksWithoutObstacle(cell, library);
        }
    }

    /// What was the user's and is neither in the files, nor in the index or a commit.
    std::set<std::string> lostFrom(const Snapshot &before, const Snapshot &after,
                                   const fs::path &folder) const
    {
        std::set<std::string> contents = before.indexIds;
        for (const auto &[name, id] : before.fileIds)
            contents.insert(id);
        for (const auto &id : committed_)
            contents.erase(id);
        return vclink::test::lostOf(std::move(contents), after, folder / "copy");
    }
    static Snapshot look(const fs::path &folder)
    {
        return vclink::test::takeSnapshot(folder / "copy", folder);
    }

    void expectWorksWithoutObstacle(const Cell &cell, const fs::path &library)
    {
        vclink::test::clearSurroundings(original_, library);
        cell.prepare(GitRepository(library / "copy"));
        EXPECT_EQ(cell.byLibrary(library / "copy"), "") << "though nothing is in the way any more";
        std::string key;
        for (const auto &argument : cell.byGit)
            key += argument + ' ';
        if (references_.count(key) == 0)
        {
            const fs::path reference = makeTwin(cell, "reference", false);
            GitRepository(reference / "copy").git(cell.byGit);
            references_[key] = look(reference);
            fs::remove_all(reference);
        }
        EXPECT_EQ(vclink::test::differenceOf(references_[key], look(library)), "");
    }

    bool isExplained(const Comparand &comparand)
    {
        bool isMet = false;
        for (const auto &difference : vclink::test::surroundingDifferences())
        {
            if (!difference.explains(comparand))
                continue;
            met_.insert(&difference);
            isMet = true;
        }
        return isMet;
    }

    vclink::test::LibGit2Session session_{environment()};
    const fs::path original_ = folder() / "original";
    std::set<std::string> committed_;
    std::map<std::string, Snapshot> references_;
    std::set<const vclink::test::SurroundingDifference *> met_;
    std::map<std::string, int> outcomes_;
    int cells_ = 0;
};

class BranchSurroundings : public Surroundings, public testing::WithParamInterface<Operation>
{
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
            if (obstacle.place != place.holds || commonOnes < operation.commonOnes)
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
            check({{operation.name, obstacle.name, place.name, "", ""},
                   obstacle,
                   place,
                   byGit,
                   byLibrary});
        }
    }
    conclude(operation.name);
}

INSTANTIATE_TEST_SUITE_P(Operations, BranchSurroundings, testing::ValuesIn(operations),
                         [](const auto &instance) { return instance.param.name; });

class RevertSurroundings : public Surroundings, public testing::WithParamInterface<bool>
{
  protected:
    /// What a revert names in a place: a folder, by a file below it.
    static std::string nameIn(const Place &place)
    {
        return place.holds == Holds::folder ? place.path + "/file" : place.path;
    }
};

TEST_P(RevertSurroundings, LoseNothingThatGitKeepsAndOtherwiseDifferByRuleOnly)
{
    const bool isListed = GetParam();
    const std::string operation = isListed ? "revert" : "revert of another file";
    go("main");
    for (const auto &place : vclink::test::allPlaces())
    {
        for (const auto &obstacle : vclink::test::allObstacles())
        {
            const bool isWorthwhile = isListed || obstacle.isCommon;
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
                if (place.holds != Holds::nothing || obstacle.name.find("staged") == 0)
                    byGit.push_back(nameIn(place));
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
            check({{operation, obstacle.name, place.name, "", ""},
                   obstacle,
                   place,
                   byGit,
                   byLibrary,
                   [](const GitRepository &copy) { copy.remove("other"); }});
        }
    }
    conclude(operation);
}

INSTANTIATE_TEST_SUITE_P(Lists, RevertSurroundings, testing::Bool(),
                         [](const auto &instance)
                         { return instance.param ? "OfWhatIsInTheWay" : "OfAnotherFile"; });

} // namespace
