// SPDX-License-Identifier: MIT
#include <algorithm>
#include <string>
#include <type_traits>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "BranchFixture.hpp"
#include "support/Descriptors.hpp"

namespace
{

using testing::ElementsAre;
using testing::IsEmpty;
using vclink::git::BranchPointer;
using vclink::test::Failure;
using vclink::test::failureOf;
using vclink::test::GitRepository;
using vclink::test::namesOf;
using vclink::test::NothingChanges;
using vclink::test::splitLines;

class BranchLists : public vclink::test::BranchFixture
{
  protected:
    std::vector<std::string> local() const
    {
        return namesOf(branches().getLocalBranches());
    }
    std::vector<std::string> remote() const
    {
        return namesOf(branches().getRemoteBranches());
    }
    std::vector<std::string> byGit(const std::string &below) const
    {
        return splitLines(repository_.git({"for-each-ref", "--format=%(refname)", below}));
    }
    void makeRemoteBranch(const std::string &name) const
    {
        repository_.git({"update-ref", "refs/remotes/" + name, "HEAD"});
    }
};

TEST_F(BranchLists, AreEmptyBeforeTheFirstCommit)
{
    const NothingChanges nothing(repository_);
    EXPECT_THAT(local(), IsEmpty());
    EXPECT_THAT(remote(), IsEmpty());
}

TEST_F(BranchLists, AreEmptyWithADetachedHeadAndNoBranch)
{
    repository_.commitAll("first");
    repository_.git({"checkout", "--quiet", "--detach"});
    repository_.git({"branch", "-D", "main"});
    EXPECT_THAT(local(), IsEmpty());
}

TEST_F(BranchLists, HoldFullNamesWhereTheCurrentBranchHasAShortOne)
{
    repository_.commitAll("first");
    EXPECT_THAT(local(), ElementsAre("refs/heads/main"));
    EXPECT_EQ(branches().getCurrentBranch().getName(), "main");
    EXPECT_NE(branches().getLocalBranches().front(), branches().getCurrentBranch());
}

TEST_F(BranchLists, HoldEachBranchOnItsOwnSide)
{
    repository_.commitAll("first");
    repository_.git({"branch", "folder/topic"});
    repository_.git({"branch", "another"});
    repository_.git({"tag", "v1"});
    makeRemoteBranch("origin/main");
    makeRemoteBranch("upstream/topic");
    EXPECT_THAT(local(),
                ElementsAre("refs/heads/another", "refs/heads/folder/topic", "refs/heads/main"));
    EXPECT_THAT(remote(), ElementsAre("refs/remotes/origin/main", "refs/remotes/upstream/topic"));
    EXPECT_EQ(local(), byGit("refs/heads"));
    EXPECT_EQ(remote(), byGit("refs/remotes"));
}

TEST_F(BranchLists, HoldTheHeadOfAClonedRemoteAsABranchOfItsOwn)
{
    repository_.commitAll("first");
    const auto clone = GitRepository::clone(repository_.path(), folder() / "clone");
    const auto adapter = makeAdapter(clone.path());
    EXPECT_THAT(namesOf(vclink::git::BranchManager::create(*adapter)->getRemoteBranches()),
                ElementsAre("refs/remotes/origin/HEAD", "refs/remotes/origin/main"));
}

TEST_F(BranchLists, HoldPackedAndLooseBranches)
{
    repository_.commitAll("first");
    repository_.git({"branch", "packed"});
    repository_.git({"pack-refs", "--all"});
    repository_.git({"branch", "loose"});
    auto names = local();
    std::sort(names.begin(), names.end());
    EXPECT_EQ(names, byGit("refs/heads"));
    EXPECT_EQ(names.size(), 3U);
}

TEST_F(BranchLists, GiveEachNameOnceWhenItIsPackedAndLoose)
{
    repository_.commitAll("first");
    repository_.git({"pack-refs", "--all"});
    repository_.commitAll("second");
    EXPECT_THAT(local(), ElementsAre("refs/heads/main"));
}

TEST_F(BranchLists, HoldNamesThatAreNoAscii)
{
    repository_.commitAll("first");
    const std::string utf8 = "gr\xC3\xBC\xC3\x9F";
    const std::string noUtf8 = "caf\xE9";
    repository_.git({"branch", utf8});
    repository_.git({"branch", noUtf8});
    EXPECT_THAT(local(), testing::UnorderedElementsAre("refs/heads/main", "refs/heads/" + utf8,
                                                       "refs/heads/" + noUtf8));
}

TEST_F(BranchLists, HoldABranchThatLeadsToAnother)
{
    repository_.commitAll("first");
    repository_.git({"symbolic-ref", "refs/heads/alias", "refs/heads/main"});
    EXPECT_THAT(local(), ElementsAre("refs/heads/alias", "refs/heads/main"));
}

TEST_F(BranchLists, SeeWhatChangedSinceTheManagerWasMade)
{
    repository_.commitAll("first");
    EXPECT_THAT(local(), ElementsAre("refs/heads/main"));
    repository_.git({"branch", "later"});
    EXPECT_THAT(local(), ElementsAre("refs/heads/later", "refs/heads/main"));
    repository_.git({"branch", "-D", "later"});
    EXPECT_THAT(local(), ElementsAre("refs/heads/main"));
}

TEST_F(BranchLists, OfManyBranchesAreWhole)
{
    repository_.commitAll("first");
    const std::string head = idOf("HEAD");
    std::string commands;
    for (int i = 0; i < 2000; ++i)
        commands += "create refs/heads/b" + std::to_string(i) + ' ' + head + '\n';
    ASSERT_TRUE(repository_.command({"update-ref", "--stdin"}).input(commands).run().succeeded());
    repository_.git({"pack-refs", "--all"});
    EXPECT_EQ(local(), byGit("refs/heads"));
    EXPECT_EQ(local().size(), 2001U);
}

TEST_F(BranchLists, LeaveNoDescriptorOpen)
{
    repository_.commitAll("first");
    local();
    const vclink::test::NoDescriptorLeak noLeak;
    local();
    remote();
}

TEST_F(BranchLists, LeaveOutABranchThatIsBrokenAsGitDoes)
{
    repository_.commitAll("first");
    repository_.write(".git/refs/heads/broken", "garbage\n");
    repository_.git({"branch", "whole"});
    EXPECT_THAT(local(), ElementsAre("refs/heads/main", "refs/heads/whole"));
    EXPECT_EQ(local(), byGit("refs/heads"));
}

TEST_F(BranchLists, FailWhereTheRepositoryCannotBeOpened)
{
    repository_.remove(".git");
    const Failure failure = failureOf([this] { local(); });
    EXPECT_EQ(failure.code, -3);
    EXPECT_EQ(failureOf([this] { remote(); }), failure);
}

TEST_F(BranchLists, AreOfOneWorkingCopyAndShownInEach)
{
    repository_.commitAll("first");
    const std::string linked = folder() / "linked";
    repository_.git({"worktree", "add", "--quiet", "-b", "second", linked});
    const auto adapter = makeAdapter(linked);
    const auto manager = vclink::git::BranchManager::create(*adapter);
    EXPECT_EQ(namesOf(manager->getLocalBranches()), local());
    EXPECT_EQ(manager->getCurrentBranch().getName(), "second");
}

TEST(BranchPointerValue, HoldsItsNameAsGiven)
{
    const BranchPointer branch("caf\xE9/x");
    EXPECT_EQ(branch.getName(), "caf\xE9/x");
    EXPECT_TRUE((std::is_same_v<decltype(branch.getName()), std::string>)) << "a copy";
}

TEST(BranchPointerValue, LeavesTheCallersNameAlone)
{
    const std::string name = "topic/of-more-than-a-few-characters";
    const BranchPointer branch(name);
    EXPECT_EQ(branch.getName(), name);
    EXPECT_EQ(name, "topic/of-more-than-a-few-characters");
}

TEST(BranchPointerValue, ComparesNamesExactly)
{
    const BranchPointer branch("main");
    EXPECT_TRUE(branch == BranchPointer("main"));
    EXPECT_FALSE(branch != BranchPointer("main"));
    for (const auto *other : {"Main", "main ", "refs/heads/main", "", "mai"})
    {
        EXPECT_FALSE(branch == BranchPointer(other)) << other;
        EXPECT_TRUE(branch != BranchPointer(other)) << other;
    }
}

TEST(BranchPointerValue, IsCopiedAndAssigned)
{
    BranchPointer first("one");
    const BranchPointer copy = first;
    first = BranchPointer("two");
    EXPECT_EQ(copy.getName(), "one");
    EXPECT_EQ(first.getName(), "two");
}

} // namespace
