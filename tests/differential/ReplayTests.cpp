// SPDX-License-Identifier: MIT
#include <algorithm>
#include <cstdlib>
#include <exception>
#include <filesystem>
#include <fstream>
#include <iostream>
#include <iterator>
#include <map>
#include <memory>
#include <set>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "FloorMerge.hpp"
#include "MergeHistory.hpp"
#include "expectedStates.hpp"
#include "mergeDifferences.hpp"
#include "support/GitFixture.hpp"
#include "support/LibGit2Session.hpp"
#include "support/RepositoryState.hpp"
#include "support/adapterFor.hpp"
#include "support/text.hpp"
#include "vclink/git/BranchManager.hpp"
#include "vclink/git/GitException.hpp"
#include "vclink/git/messageIdentifiers.hpp"

namespace
{

namespace fs = std::filesystem;
using vclink::git::BranchManager;
using vclink::git::GitException;
using namespace vclink::test;

constexpr std::uint64_t mergeBlocks = 8;
constexpr std::size_t mergeCount = 208;
constexpr std::uint64_t usualSeed = 1;

using Arguments = std::vector<std::string>;
/// Compares lines as libgit2 does.
const Arguments olderStrategy{"--strategy=recursive", "--strategy-option=diff-algorithm=myers"};
const Arguments noFolderRenames{"-c", "merge.directoryRenames=false"};

constexpr auto committed = "committed";
constexpr auto conflicts = "conflicts";

/// What the host is told when a merge leaves conflicts.
std::string conflictText(const std::string &name)
{
    const GitException cause{shared_vclink::git::HasConflicts()};
    const GitException failure(shared_vclink::git::MergeFailed(name), cause.GetUnicodeMessageTxt());
    return asUtf8(failure.GetUnicodeMessageTxt());
}

void reset(const GitRepository &repository, const std::string &commit)
{
    repository.git({"reset", "--quiet", "--hard", commit});
    repository.git({"clean", "--quiet", "-ffdx"});
}

/// A history's merges once more: by the library, by libgit2 alone and by git, each in a working
/// copy of its own. VCLINK_SEED chooses another history than the usual one; VCLINK_KEEP names a
/// path to which the working copies are moved in the end.
class MergeReplay : public GitFixture, public testing::WithParamInterface<std::uint64_t>
{
  protected:
    MergeReplay()
    {
        std::ofstream(environment().home() / ".gitconfig")
            << "[user]\n\tname = Somebody\n\temail = somebody@example.com\n[merge]\n\tff = false\n";
        const char *const seed = std::getenv("VCLINK_SEED");
        const auto source = makeRepository("source");
        MergeHistory(seed != nullptr ? std::stoull(seed) : usualSeed, mergeCount)
            .importInto(source);
        merges_ = listMerges(source);
        for (const auto *copy : {&library_, &floor_, &git_})
        {
            GitRepository::clone(source.path(), copy->path());
        }
        adapter_ = adapterFor(library_);
        floorAdapter_ = adapterFor(floor_);
        manager_ = BranchManager::create(*adapter_);
    }
    ~MergeReplay() override
    {
        if (const char *const kept = std::getenv("VCLINK_KEEP"))
        {
            fs::rename(folder().path(), kept);
        }
    }

    const std::vector<MergeCommit> &merges() const
    {
        return merges_;
    }

    void replay(const MergeCommit &merge)
    {
        for (const auto *copy : {&library_, &floor_})
        {
            reset(*copy, merge.firstParent);
        }
        const std::string outcome = mergeByLibrary(merge);
        if (outcome != committed && outcome != conflicts)
        {
            expectRefused(merge, outcome);
            return;
        }
        compareWithFloor(merge, outcome);
        compareWithGit(merge, outcome);
        ++counts_[outcome];
    }

    /// How often each outcome and each rule was met.
    const std::map<std::string, int> &counts() const
    {
        return counts_;
    }

  private:
    /// @return committed, conflicts, or the text of another failure
    std::string mergeByLibrary(const MergeCommit &merge)
    {
        try
        {
            manager_->merge(merge.secondParent);
            EXPECT_EQ(manager_->getRepositoryState(), "Normal");
            return committed;
        }
        catch (const GitException &exception)
        {
            EXPECT_EQ(exception.GetBaseMsgIDObj().getKey(), "MergeFailed");
            EXPECT_EQ(manager_->getRepositoryState(),
                      fs::exists(library_ / ".git/MERGE_HEAD") ? "Conflicts" : "Normal");
            const std::string text = asUtf8(exception.GetUnicodeMessageTxt());
            return text == conflictText(merge.secondParent) ? conflicts : text;
        }
    }

    /// libgit2 would fail halfway, or lose one of a renamed file and a folder of its name.
    void expectRefused(const MergeCommit &merge, const std::string &outcome)
    {
        const auto end = outcome.find("' is a renamed file of one side and a folder of the other");
        ASSERT_NE(end, std::string::npos) << outcome;
        const auto begin = outcome.rfind('\'', end - 1) + 1;
        const std::string path = outcome.substr(begin, end - begin);
        EXPECT_TRUE(MergeExplanations(git_, merge).isRenamedOntoFolder(path)) << path;
        EXPECT_EQ(library_.git({"status", "--porcelain"}), "");
        EXPECT_EQ(library_.git({"rev-parse", "HEAD"}), merge.firstParent + '\n');
        ++counts_["refused"];
    }

    void compareWithFloor(const MergeCommit &merge, const std::string &outcome)
    {
        const bool isClean = mergeWithLibGit2(floor_, merge.secondParent);
        EXPECT_EQ(outcome, isClean ? committed : conflicts);
        EXPECT_EQ(describeHead(library_), describeHead(floor_));
        const auto byLibrary = stateOf(library_);
        const auto byFloor = stateOf(floor_);
        EXPECT_EQ(byLibrary.underWay, byFloor.underWay);
        EXPECT_EQ(byLibrary.index, byFloor.index);
        EXPECT_EQ(byLibrary.workingTree, byFloor.workingTree);
        EXPECT_EQ(statesOfAll(*adapter_), statesOfAll(*floorAdapter_));
    }

    void compareWithGit(const MergeCommit &merge, const std::string &outcome)
    {
        const MergedPaths byLibrary = readMergedPaths(library_, merge);
        const MergedPaths byGit = mergeByGit(merge, {}, {});
        auto unexplained = findDifferences(byLibrary, byGit);
        if (unexplained.empty())
        {
            const bool isClean = !fs::exists(git_ / ".git/MERGE_HEAD");
            EXPECT_EQ(outcome, isClean ? committed : conflicts);
            if (isClean)
            {
                EXPECT_EQ(describeHead(library_), describeHead(git_));
            }
            ++counts_["as git"];
            return;
        }
        const MergedPaths withoutFolders = mergeByGit(merge, {}, noFolderRenames);
        const auto others = findDifferences(byLibrary, withoutFolders);
        countExplained(unexplained, others, "git lets files follow a folder that was moved");
        explain(merge, unexplained, byLibrary, withoutFolders);
    }

    void explain(const MergeCommit &merge, std::set<std::string> unexplained,
                 const MergedPaths &byLibrary, const MergedPaths &byGit)
    {
        const MergeExplanations explanations(git_, merge);
        for (auto path = unexplained.begin(); path != unexplained.end();)
        {
            const std::string rule = explanations.explain(*path, byLibrary, byGit);
            path = rule.empty() ? std::next(path) : unexplained.erase(path);
            if (!rule.empty())
            {
                ++counts_[rule];
            }
        }
        if (unexplained.empty())
        {
            return;
        }
        auto others = findDifferences(byLibrary, mergeByGit(merge, olderStrategy, noFolderRenames));
        std::copy_if(unexplained.begin(), unexplained.end(), std::inserter(others, others.end()),
                     [&explanations](const auto &path) { return !explanations.hasTwoFiles(path); });
        countExplained(unexplained, others, "git compares lines with another algorithm");
        for (const auto &path : unexplained)
        {
            ADD_FAILURE() << path << " by the library:\n"
                          << describe(byLibrary, path) << "by git:\n"
                          << describe(byGit, path);
        }
    }

    /// Takes the paths away that are not among `others`.
    void countExplained(std::set<std::string> &paths, const std::set<std::string> &others,
                        const std::string &rule)
    {
        for (auto path = paths.begin(); path != paths.end();)
        {
            const bool isExplained = others.count(*path) == 0;
            path = isExplained ? paths.erase(path) : std::next(path);
            if (isExplained)
            {
                ++counts_[rule];
            }
        }
    }

    MergedPaths mergeByGit(const MergeCommit &merge, const Arguments &strategy,
                           const Arguments &settings)
    {
        reset(git_, merge.firstParent);
        Arguments arguments = settings;
        arguments.insert(arguments.end(), {"merge", "--quiet", "--no-edit"});
        arguments.insert(arguments.end(), strategy.begin(), strategy.end());
        arguments.push_back(merge.secondParent);
        const auto result = git_.tryGit(arguments);
        EXPECT_EQ(result.succeeded(), !fs::exists(git_ / ".git/MERGE_HEAD")) << result.errors;
        return readMergedPaths(git_, merge);
    }

    /// Tree and parents.
    static std::string describeHead(const GitRepository &repository)
    {
        return repository.git({"log", "-1", "--format=%T %P"});
    }

    LibGit2Session session_{environment()};
    GitRepository library_{folder() / "library"};
    GitRepository floor_{folder() / "floor"};
    GitRepository git_{folder() / "git"};
    std::vector<MergeCommit> merges_;
    std::unique_ptr<vclink::CMAdapter> adapter_;
    std::unique_ptr<vclink::CMAdapter> floorAdapter_;
    std::unique_ptr<BranchManager> manager_;
    std::map<std::string, int> counts_;
};

TEST_P(MergeReplay, GivesWhatLibGit2GivesAndDiffersFromGitByRuleOnly)
{
    ASSERT_GE(merges().size(), mergeCount);
    const auto first = merges().size() * GetParam() / mergeBlocks;
    const auto end = merges().size() * (GetParam() + 1) / mergeBlocks;
    for (auto number = first; number < end; ++number)
    {
        const MergeCommit &merge = merges()[number];
        SCOPED_TRACE("merge " + std::to_string(number) + ", " + merge.subject + ": " +
                     merge.firstParent + " and " + merge.secondParent);
        replay(merge);
    }
    for (const auto &[subject, count] : counts())
    {
        std::cout << count << " x " << subject << '\n';
    }
    for (const auto *outcome : {committed, conflicts, "as git"})
    {
        EXPECT_EQ(counts().count(outcome), 1u) << outcome << ": the merges are too much alike";
    }
}

class MergeHistories : public GitFixture
{
};

TEST_F(MergeHistories, HoldMergesOfEveryKindAndSeveralMergeBases)
{
    const auto repository = makeRepository();
    MergeHistory(usualSeed, mergeCount).importInto(repository);
    std::set<std::string> kinds;
    int severalBases = 0;
    for (const auto &merge : listMerges(repository))
    {
        kinds.insert(merge.subject);
        const auto bases =
            repository.git({"merge-base", "--all", merge.firstParent, merge.secondParent});
        severalBases += std::count(bases.begin(), bases.end(), '\n') > 1 ? 1 : 0;
    }
    for (const auto &kind : MergeEdits::kinds())
        EXPECT_EQ(kinds.count(kind.name), 1u) << kind.name;
    EXPECT_GE(severalBases, 10);
}

TEST_F(MergeHistories, DependOnTheSeedAlone)
{
    std::set<std::string> tips;
    int number = 0;
    for (const auto seed : {usualSeed, usualSeed, usualSeed + 1})
    {
        const auto repository = makeRepository(std::to_string(++number));
        MergeHistory(seed, 20).importInto(repository);
        tips.insert(repository.git({"for-each-ref"}));
    }
    EXPECT_EQ(tips.size(), 2u);
}

INSTANTIATE_TEST_SUITE_P(Blocks, MergeReplay, testing::Range<std::uint64_t>(0, mergeBlocks));

} // namespace
