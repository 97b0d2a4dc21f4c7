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

namespace
{

using vclink::git::BasicBranchManager;
using vclink::git::BranchManager;
using namespace vclink::test;

class CurrentBranch : public BranchFixture
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

TEST_F(CurrentBranch, IsNoneBeforeTheFirstCommitOrOnADetachedHead)
{
    {
        const NothingChanges nothing(repository_);
        const Failure failure = failureOf([this] { name(); });
        EXPECT_EQ(failure.code, GIT_EUNBORNBRANCH);
        EXPECT_EQ(failure.text, "reference 'refs/heads/main' not found");
    }
    repository_.commitAll("first");
    repository_.git({"checkout", "--quiet", "--detach"});
    const NothingChanges nothing(repository_);
    const Failure failure = failureOf([this] { name(); });
    EXPECT_EQ(failure.code, GIT_ERROR);
    EXPECT_EQ(failure.text, "reference 'HEAD' is neither a local nor a remote branch.");
}

using BranchManagerObject = BranchFixture;

TEST_F(BranchManagerObject, IsMadeForAGitAdapterAloneAndOpensNoRepositoryThen)
{
    const auto adapter = makeAdapter(folder() / "missing");
    const auto manager = BranchManager::create(*adapter);
    const BranchManager &base = *manager;
    EXPECT_EQ(typeid(base), typeid(BasicBranchManager));
    EXPECT_TRUE((std::is_same_v<decltype(BranchManager::create(*adapter_)),
                                std::unique_ptr<BranchManager>>));
    OtherAdapter other;
    EXPECT_THROW(static_cast<void>(BranchManager::create(other)), std::bad_cast);
}

/// The adapter and the callbacks are borrowed, the factory is shared.
TEST_F(BranchManagerObject, HasItsMembersInOrderAsItsMergerHas)
{
    const auto factory = adapter_->getOptionsFactory();
    const long shares = factory.use_count();
    const vclink::git::BranchMerger merger(*adapter_, factory, adapter_->getCallbacks());
    EXPECT_EQ(factory.use_count(), shares + 1);
    const BasicBranchManager manager(*adapter_);
    EXPECT_EQ(factory.use_count(), shares + 2);
    ASSERT_EQ(sizeof(merger), 4 * sizeof(void *));
    ASSERT_EQ(sizeof(manager), 5 * sizeof(void *));
    const void *words[9];
    std::memcpy(words, static_cast<const void *>(&merger), sizeof(merger));
    std::memcpy(words + 4, static_cast<const void *>(&manager), sizeof(manager));
    // The manager's first is that of its virtual functions.
    for (const int first : {0, 5})
    {
        EXPECT_EQ(words[first], adapter_.get());
        EXPECT_EQ(words[first + 1], factory.get());
        EXPECT_EQ(words[first + 3], &adapter_->getCallbacks());
    }
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
    EXPECT_FALSE(std::is_copy_constructible_v<BranchManager>);
    EXPECT_FALSE(std::is_copy_assignable_v<BranchManager>);
}

} // namespace
