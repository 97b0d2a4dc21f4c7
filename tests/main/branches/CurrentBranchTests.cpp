// SPDX-License-Identifier: MIT
#include <cstring>
#include <memory>
#include <string>
#include <type_traits>
#include <typeinfo>
#include <vector>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "BranchFixture.hpp"
#include "error/VirtualTable.hpp"
#include "main/BasicBranchManager.hpp"
#include "main/OtherAdapter.hpp"
#include "main/merge/BranchMerger.hpp"
#include "support/Descriptors.hpp"

namespace
{

using vclink::git::BasicBranchManager;
using vclink::git::BranchManager;
using vclink::test::Failure;
using vclink::test::failureOf;
using vclink::test::NothingChanges;
using vclink::test::slotOf;

class CurrentBranch : public vclink::test::BranchFixture
{
  protected:
    std::string name() const
    {
        return branches().getCurrentBranch().getName();
    }
};

TEST_F(CurrentBranch, HasItsShortName)
{
    repository_.commitAll("first");
    EXPECT_EQ(name(), "main");
    for (const std::string other : {"folder/topic", "gr\xC3\xBC\xC3\x9F", "caf\xE9", "heads/main"})
    {
        repository_.git({"checkout", "--quiet", "-b", other});
        EXPECT_EQ(name(), other);
    }
}

TEST_F(CurrentBranch, IsNoneBeforeTheFirstCommit)
{
    const NothingChanges nothing(repository_);
    const Failure failure = failureOf([this] { name(); });
    EXPECT_EQ(failure.code, GIT_EUNBORNBRANCH);
    EXPECT_EQ(failure.text, "reference 'refs/heads/main' not found");
}

TEST_F(CurrentBranch, IsNoneOnADetachedHead)
{
    repository_.commitAll("first");
    repository_.git({"checkout", "--quiet", "--detach"});
    const NothingChanges nothing(repository_);
    const Failure failure = failureOf([this] { name(); });
    EXPECT_EQ(failure.code, GIT_ERROR);
    EXPECT_EQ(failure.text, "reference 'HEAD' is neither a local nor a remote branch.");
}

TEST_F(CurrentBranch, IsNoneWhereTheRepositoryCannotBeOpened)
{
    repository_.remove(".git");
    EXPECT_EQ(failureOf([this] { name(); }).code, GIT_ENOTFOUND);
}

TEST_F(CurrentBranch, FollowsWhatOthersDo)
{
    repository_.commitAll("first");
    EXPECT_EQ(name(), "main");
    repository_.git({"checkout", "--quiet", "-b", "topic"});
    EXPECT_EQ(name(), "topic");
}

TEST_F(CurrentBranch, LeavesNoDescriptorOpen)
{
    repository_.commitAll("first");
    name();
    const vclink::test::NoDescriptorLeak noLeak;
    EXPECT_EQ(name(), "main");
}

class BranchManagerObject : public vclink::test::BranchFixture
{
};

TEST_F(BranchManagerObject, IsMadeForAGitAdapter)
{
    const auto manager = BranchManager::create(*adapter_);
    const BranchManager &base = *manager;
    EXPECT_EQ(typeid(base), typeid(BasicBranchManager));
    EXPECT_TRUE((std::is_same_v<decltype(BranchManager::create(*adapter_)),
                                std::unique_ptr<BranchManager>>));
}

TEST_F(BranchManagerObject, IsMadeForNoOtherAdapter)
{
    vclink::test::OtherAdapter other;
    EXPECT_THROW(static_cast<void>(BranchManager::create(other)), std::bad_cast);
}

TEST_F(BranchManagerObject, OpensNoRepositoryWhenItIsMade)
{
    const auto adapter = makeAdapter(folder() / "missing");
    EXPECT_NO_THROW(static_cast<void>(BranchManager::create(*adapter)));
}

TEST_F(BranchManagerObject, SharesTheFactoryAndBorrowsTheCallbacks)
{
    const auto adapter = makeAdapter(repository_.path());
    const auto factory = adapter->getOptionsFactory();
    ASSERT_EQ(factory.use_count(), 2);
    auto manager = BranchManager::create(*adapter);
    EXPECT_EQ(factory.use_count(), 3);
    manager.reset();
    EXPECT_EQ(factory.use_count(), 2);
}

/// Adapter, factory, callbacks.
TEST_F(BranchManagerObject, HasItsMembersInOrder)
{
    const BasicBranchManager manager(*adapter_);
    ASSERT_EQ(sizeof(manager), 5 * sizeof(void *));
    const void *words[5];
    std::memcpy(words, static_cast<const void *>(&manager), sizeof(words));
    EXPECT_EQ(words[1], adapter_.get());
    EXPECT_EQ(words[2], adapter_->getOptionsFactory().get());
    EXPECT_EQ(words[4], &adapter_->getCallbacks());
}

TEST_F(BranchManagerObject, HasItsMergerWithTheSameMembers)
{
    const auto factory = adapter_->getOptionsFactory();
    const long shares = factory.use_count();
    const vclink::git::BranchMerger merger(*adapter_, factory, adapter_->getCallbacks());
    EXPECT_EQ(factory.use_count(), shares + 1);
    ASSERT_EQ(sizeof(merger), 4 * sizeof(void *));
    const void *words[4];
    std::memcpy(words, static_cast<const void *>(&merger), sizeof(words));
    EXPECT_EQ(words[0], adapter_.get());
    EXPECT_EQ(words[1], factory.get());
    EXPECT_EQ(words[3], &adapter_->getCallbacks());
}

TEST_F(BranchManagerObject, HasItsOperationsInTheOrderThatHostsCountOn)
{
    EXPECT_TRUE(std::has_virtual_destructor_v<BranchManager>);
    EXPECT_TRUE(std::is_abstract_v<BranchManager>);
    const std::vector<std::size_t> slots{
        slotOf(&BranchManager::getLocalBranches),  slotOf(&BranchManager::getRemoteBranches),
        slotOf(&BranchManager::getHeadRevision),   slotOf(&BranchManager::getRevision),
        slotOf(&BranchManager::getRevisionId),     slotOf(&BranchManager::switchBranch),
        slotOf(&BranchManager::createBranch),      slotOf(&BranchManager::deleteBranch),
        slotOf(&BranchManager::getCurrentBranch),  slotOf(&BranchManager::merge),
        slotOf(&BranchManager::getRepositoryState)};
    EXPECT_THAT(slots, testing::ElementsAre(2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12));
    EXPECT_TRUE((std::is_same_v<BranchManager::BranchName, std::string>));
    EXPECT_TRUE(
        (std::is_same_v<decltype(&BranchManager::merge), void (BranchManager::*)(std::string)>))
        << "the name comes by value";
}

TEST_F(BranchManagerObject, IsNotCopied)
{
    EXPECT_FALSE(std::is_copy_constructible_v<BranchManager>);
    EXPECT_FALSE(std::is_copy_assignable_v<BranchManager>);
}

} // namespace
