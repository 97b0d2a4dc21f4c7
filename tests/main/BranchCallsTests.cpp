// SPDX-License-Identifier: MIT
// The calls to libgit2 of lists, switches and other operations on branches.
#include <functional>
#include <string>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "BranchCallsTest.hpp"

namespace
{

namespace git = vclink::git;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::SizeIs;
using vclink::test::BranchCalls;
using vclink::test::libGit2FailureOf;
using vclink::test::NothingChanges;
using vclink::test::stateOf;

class CallsOnBranches : public vclink::test::BranchCallsTest
{
  protected:
    /// Expects that a failure of each call is raised, with the repository released.
    void expectEachRaised(const Calls &names, const std::function<void()> &action) const
    {
        for (const auto &name : names)
        {
            BranchCalls calls;
            calls.failing[name] = GIT_ERROR;
            EXPECT_EQ(libGit2FailureOf(action), injected_) << name;
            EXPECT_EQ(calls.names.back(),
                      name == "repository_open_ext" ? "repository_open_ext" : "repository_free")
                << name;
        }
    }
};

TEST_F(CallsOnBranches, OfAListAreTheseInOrder)
{
    BranchCalls calls;
    branches().getLocalBranches();
    EXPECT_THAT(calls.names, ElementsAre("repository_open_ext", "branch_iterator_new",
                                         "branch_next", "reference_free", "branch_next",
                                         "branch_iterator_free", "repository_free"));
}

TEST_F(CallsOnBranches, OfAListAreRaisedWhenTheyFail)
{
    expectEachRaised({"repository_open_ext", "branch_iterator_new", "branch_next"},
                     [this] { branches().getLocalBranches(); });
    expectEachRaised({"repository_open_ext", "branch_iterator_new", "branch_next"},
                     [this] { branches().getRemoteBranches(); });
}

TEST_F(CallsOnBranches, OfAListEndIt)
{
    BranchCalls calls;
    calls.failing["branch_next"] = GIT_ITEROVER;
    EXPECT_THAT(branches().getLocalBranches(), IsEmpty());
}

TEST_F(CallsOnBranches, OfASwitchAreTheseInOrder)
{
    makeAhead();
    BranchCalls calls;
    branches().switchBranch("topic");
    EXPECT_THAT(calls.names, ElementsAre("repository_open_ext", "branch_lookup", "revparse_single",
                                         "checkout_tree", "repository_set_head", "object_free",
                                         "reference_free", "repository_free"));
}

TEST_F(CallsOnBranches, OfASwitchHaveTheRecordOfASafeCheckout)
{
    makeAhead();
    BranchCalls calls;
    branches().switchBranch("topic");
    ASSERT_THAT(calls.checkouts, SizeIs(1));
    expectCheckoutRecord(calls.checkouts[0], 1);
    EXPECT_THAT(calls.checkoutPaths[0], IsEmpty());
}

TEST_F(CallsOnBranches, OfASwitchAreRaisedWhenTheyFail)
{
    makeAhead();
    const NothingChanges nothing(repository_);
    expectEachRaised({"repository_open_ext", "branch_lookup", "revparse_single", "checkout_tree"},
                     [this] { branches().switchBranch("topic"); });
}

TEST_F(CallsOnBranches, OfASwitchLeaveTheHeadWhenItCannotBeSet)
{
    makeAhead();
    const std::string head = stateOf(repository_).head;
    expectEachRaised({"repository_set_head"}, [this] { branches().switchBranch("topic"); });
    EXPECT_EQ(stateOf(repository_).head, head);
}

TEST_F(CallsOnBranches, OfANewBranchAreTheseInOrder)
{
    BranchCalls calls;
    branches().createBranch(git::BranchParameters("new", "main"));
    EXPECT_THAT(calls.names, ElementsAre("repository_open_ext", "reference_dwim", "object_lookup",
                                         "reference_free", "branch_create", "reference_free",
                                         "object_free", "repository_free"));
}

TEST_F(CallsOnBranches, OfANewBranchAreRaisedWhenTheyFail)
{
    const NothingChanges nothing(repository_);
    expectEachRaised({"repository_open_ext", "reference_dwim", "branch_create"},
                     [this] { branches().createBranch(git::BranchParameters("new", "main")); });
}

TEST_F(CallsOnBranches, OfADeletionAreTheseInOrderAndRaised)
{
    repository_.git({"branch", "old"});
    {
        const NothingChanges nothing(repository_);
        expectEachRaised({"repository_open_ext", "branch_lookup", "branch_delete"},
                         [this] { branches().deleteBranch("old"); });
    }
    BranchCalls calls;
    branches().deleteBranch("old");
    EXPECT_THAT(calls.names, ElementsAre("repository_open_ext", "branch_lookup", "branch_delete",
                                         "reference_free", "repository_free"));
}

TEST_F(CallsOnBranches, OfTheCurrentBranchAreTheseInOrderAndRaised)
{
    {
        BranchCalls calls;
        EXPECT_EQ(branches().getCurrentBranch().getName(), "main");
        EXPECT_THAT(calls.names, ElementsAre("repository_open_ext", "repository_head",
                                             "branch_name", "reference_free", "repository_free"));
    }
    expectEachRaised({"repository_open_ext", "repository_head", "branch_name"},
                     [this] { branches().getCurrentBranch(); });
}

} // namespace
