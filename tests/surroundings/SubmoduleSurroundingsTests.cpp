// SPDX-License-Identifier: MIT
#include <algorithm>
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
using vclink::test::Obstacle;
using vclink::test::Place;
using vclink::test::Surroundings;

/// An operation, by the library and by git, on a working copy that is on the branch `start`.
struct SubmoduleOperation
{
    std::string name;
    std::string start;
    std::vector<std::string> byGit;
    void (*byLibrary)(git::BranchManager &branches, const std::string &branch);
    /// of place and obstacle, how many have to be common
    int commonOnes;
    /// none for all
    std::vector<std::string> branches{};
    const std::vector<Place> &(*places)() = vclink::test::submodulePlaces;
    /// Completes what a switch to the branch `start` has left.
    void (*begin)(const GitRepository &copy) = [](const GitRepository &) {};
    bool hasSiblings = false;
    /// Lets git switch to the branch `start`.
    void (*clear)(const GitRepository &copy) = [](const GitRepository &) {};
};

std::ostream &operator<<(std::ostream &stream, const SubmoduleOperation &operation)
{
    return stream << operation.name << (operation.hasSiblings ? " beside siblings" : "");
}

void mergeInto(git::BranchManager &branches, const std::string &branch)
{
    branches.merge(branch);
}

void switchTo(git::BranchManager &branches, const std::string &branch)
{
    branches.switchBranch(branch);
}

void switchThereAndBack(git::BranchManager &branches, const std::string &branch)
{
    branches.switchBranch(branch);
    branches.switchBranch("main");
}

void populate(const GitRepository &copy)
{
    copy.git({"submodule", "--quiet", "update", "--init", "new"});
}

/// As after a clone; an obstacle puts a folder back.
void removeLeftFolders(const GitRepository &copy)
{
    copy.remove("s");
    copy.remove("t/s");
}

/// The submodule's own file would be in the way.
void depopulate(const GitRepository &copy)
{
    copy.git({"submodule", "--quiet", "deinit", "s"});
}

SubmoduleOperation besideSiblings(SubmoduleOperation operation)
{
    operation.hasSiblings = true;
    return operation;
}

const std::vector<std::string> mergeByGit{"merge", "--quiet", "--no-edit"};
const std::vector<std::string> thereAndBackByGit{
    "-c", "alias.visit=!f() { git switch --quiet $1 && git switch --quiet main; }; f", "visit"};

const std::vector<SubmoduleOperation> submoduleOperations{
    {"merge of submodules", "ours", mergeByGit, mergeInto, 1},
    {"merge into moved submodules",
     "ours-moves",
     mergeByGit,
     mergeInto,
     1,
     {},
     vclink::test::movedSubmodulePlaces},
    {"merge into added submodules",
     "ours-adds",
     mergeByGit,
     mergeInto,
     1,
     {},
     vclink::test::addedSubmodulePlaces,
     populate},
    {"merge into removed submodules",
     "ours-removes",
     mergeByGit,
     mergeInto,
     1,
     {},
     vclink::test::removedSubmodulePlaces,
     removeLeftFolders},
    {"merge into replaced submodules",
     "ours-files",
     mergeByGit,
     mergeInto,
     1,
     {},
     vclink::test::replacedSubmodulePlaces},
    {"merge into unfolded submodules",
     "ours-folders",
     mergeByGit,
     mergeInto,
     1,
     {},
     vclink::test::unfoldedSubmodulePlaces,
     [](const GitRepository &) {},
     false,
     depopulate},
    {"fast-forward of submodules",
     "main",
     {"merge", "--quiet", "--ff-only"},
     mergeInto,
     2,
     {"moves", "removes", "adds"}},
    {"switch of submodules", "main", {"switch", "--quiet"}, switchTo, 1},
    {"switch of submodules and back",
     "main",
     thereAndBackByGit,
     switchThereAndBack,
     2,
     {"removes", "renames", "adds"}},
    besideSiblings({"merge of submodules", "ours", mergeByGit, mergeInto, 2}),
    besideSiblings({"fast-forward of submodules",
                    "main",
                    {"merge", "--quiet", "--ff-only"},
                    mergeInto,
                    2,
                    {"moves", "removes", "adds"}}),
    besideSiblings({"switch of submodules", "main", {"switch", "--quiet"}, switchTo, 2}),
    besideSiblings({"switch of submodules and back",
                    "main",
                    thereAndBackByGit,
                    switchThereAndBack,
                    2,
                    {"removes", "renames", "adds"}})};

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

bool contains(const std::vector<std::string> &names, const std::string &name)
{
    return std::find(names.begin(), names.end(), name) != names.end();
}

class SubmoduleSurroundings : public Surroundings
{
  protected:
    explicit SubmoduleSurroundings(bool hasSiblings = false)
        : Surroundings(hasSiblings ? vclink::test::makeSubmoduleSurroundingsWithSiblings
                                   : vclink::test::makeSubmoduleSurroundings)
    {
        obstacles_ = vclink::test::submoduleObstacles();
        for (Obstacle obstacle : vclink::test::allObstacles())
        {
            if (!contains(otherObstacles, obstacle.name))
                continue;
            obstacle.isCommon = false;
            obstacles_.push_back(obstacle);
        }
    }

    std::vector<Obstacle> obstacles_;
};

class BranchesWithSubmodules : public testing::WithParamInterface<SubmoduleOperation>,
                               public SubmoduleSurroundings
{
  protected:
    BranchesWithSubmodules() : SubmoduleSurroundings(GetParam().hasSiblings)
    {
    }
};

TEST_P(BranchesWithSubmodules, LoseNothingThatGitKeepsAndOtherwiseDifferByRuleOnly)
{
    const SubmoduleOperation &operation = GetParam();
    operation.clear(original());
    go(operation.start);
    operation.begin(original());
    for (const auto &place : operation.places())
    {
        for (const auto &obstacle : obstacles_)
        {
            const int commonOnes = int{place.isCommon} + int{obstacle.isCommon};
            const bool isLeftOut =
                (!operation.branches.empty() && !contains(operation.branches, place.branch)) ||
                (operation.hasSiblings && !hasSibling(place));
            if (obstacle.place != place.holds || commonOnes < operation.commonOnes || isLeftOut)
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

INSTANTIATE_TEST_SUITE_P(Operations, BranchesWithSubmodules, testing::ValuesIn(submoduleOperations),
                         [](const auto &instance)
                         {
                             std::string name = testing::PrintToString(instance.param);
                             std::replace_if(
                                 name.begin(), name.end(),
                                 [](char character)
                                 { return character == ' ' || character == '-'; },
                                 '_');
                             return name;
                         });

enum class ListedBeside
{
    OtherFile,
    Submodule,
    SubmoduleAndSibling
};

class RevertsWithSubmodules : public testing::WithParamInterface<ListedBeside>,
                              public SubmoduleSurroundings
{
  protected:
    RevertsWithSubmodules() : SubmoduleSurroundings(GetParam() == ListedBeside::SubmoduleAndSibling)
    {
    }
};

TEST_P(RevertsWithSubmodules, LoseNothingThatGitKeepsAndOtherwiseDifferByRuleOnly)
{
    const bool isListed = GetParam() != ListedBeside::OtherFile;
    const bool hasSiblings = GetParam() == ListedBeside::SubmoduleAndSibling;
    const std::string operation =
        isListed ? "revert of submodules" : "revert of a file beside submodules";
    go("main");
    for (const auto &place : vclink::test::submodulePlaces())
    {
        for (const auto &obstacle : obstacles_)
        {
            const bool isWorthwhile =
                hasSiblings ? hasSibling(place) : isListed || obstacle.isCommon;
            if (obstacle.place != place.holds || place.branch != "unrelated" || !isWorthwhile)
                continue;
            std::vector<std::string> byGit{"restore", "--source=HEAD", "--staged", "--worktree",
                                           "mine"};
            std::vector<std::string> names{"mine"};
            if (isListed)
            {
                byGit.push_back(place.path);
                names.push_back(place.path);
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
                       copy.remove("mine");
                       if (hasSiblings)
                           copy.write(sibling, "edited\n");
                   }});
        }
    }
    conclude(operation, hasSiblings);
}

INSTANTIATE_TEST_SUITE_P(Lists, RevertsWithSubmodules,
                         testing::Values(ListedBeside::Submodule, ListedBeside::OtherFile,
                                         ListedBeside::SubmoduleAndSibling),
                         [](const auto &instance)
                         {
                             const bool hasSiblings =
                                 instance.param == ListedBeside::SubmoduleAndSibling;
                             const bool isListed = instance.param != ListedBeside::OtherFile;
                             return hasSiblings ? "OfThemAndSiblings"
                                    : isListed  ? "OfThem"
                                                : "OfAnotherFile";
                         });

} // namespace
