// SPDX-License-Identifier: MIT
// The calls to libgit2 of lists, switches and other operations on branches.
#include <functional>
#include <string>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "BranchCallsTest.hpp"
#include "support/libgit2/LibGit2Recorder.hpp"
#include "support/libgit2Release.hpp"

namespace
{

namespace git = vclink::git;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::SizeIs;
using vclink::test::libGit2FailureOf;
using vclink::test::LibGit2Recorder;
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
            LibGit2Recorder calls;
            calls.fail({{name, GIT_ERROR}});
            EXPECT_EQ(libGit2FailureOf(action), injected_) << name;
            EXPECT_EQ(calls.steps().back(), name == "git_repository_open_ext"
                                                ? "git_repository_open_ext"
                                                : "git_repository_free")
                << name;
        }
    }
};

TEST_F(CallsOnBranches, OfAListAreTheseInOrder)
{
    LibGit2Recorder calls;
    branches().getLocalBranches();
    EXPECT_THAT(calls.steps(),
                ElementsAre("git_repository_open_ext", "git_branch_iterator_new", "git_branch_next",
                            "git_reference_free", "git_branch_next", "git_branch_iterator_free",
                            "git_repository_free"));
}

TEST_F(CallsOnBranches, OfAListAreRaisedWhenTheyFail)
{
    expectEachRaised({"git_repository_open_ext", "git_branch_iterator_new", "git_branch_next"},
                     [this] { branches().getLocalBranches(); });
    expectEachRaised({"git_repository_open_ext", "git_branch_iterator_new", "git_branch_next"},
                     [this] { branches().getRemoteBranches(); });
}

TEST_F(CallsOnBranches, OfAListEndIt)
{
    LibGit2Recorder calls;
    calls.fail({{"git_branch_next", GIT_ITEROVER}});
    EXPECT_THAT(branches().getLocalBranches(), IsEmpty());
}

TEST_F(CallsOnBranches, OfASwitchAreTheseInOrder)
{
    makeAhead();
    LibGit2Recorder calls;
    branches().switchBranch("topic");
    EXPECT_EQ(
        calls.steps(),
        joined({{"git_repository_open_ext", "git_index_open", "git_repository_set_index",
                 "git_index_set_caps", "git_index_free", "git_branch_lookup", "git_revparse_single",
                 "git_branch_is_checked_out", "git_checkout_options_init"},
                lookBeforeASwitch_,
                {"git_transaction_new", "git_transaction_lock_ref", "git_transaction_free",
                 "git_checkout_tree", "git_repository_set_head"},
                endOfTheLook_,
                {"git_object_free", "git_reference_free", "git_repository_free"}}));
}

TEST_F(CallsOnBranches, OfASwitchHaveTheRecordOfASafeCheckout)
{
    makeAhead();
    LibGit2Recorder calls;
    collectRecords(calls);
    branches().switchBranch("topic");
    ASSERT_THAT(checkouts_, SizeIs(1));
    expectCheckoutRecord(checkouts_[0], vclink::test::libgit2Release::safeCheckout);
    EXPECT_THAT(checkoutPaths_[0], IsEmpty());
}

TEST_F(CallsOnBranches, OfASwitchAreRaisedWhenTheyFail)
{
    makeAhead();
    const NothingChanges nothing(repository_);
    expectEachRaised({"git_repository_open_ext", "git_index_open", "git_repository_set_index",
                      "git_index_set_caps", "git_branch_lookup", "git_revparse_single",
                      "git_repository_index", "git_repository_head", "git_reference_peel",
                      "git_tree_lookup", "git_object_peel", "git_transaction_new",
                      "git_transaction_lock_ref", "git_checkout_tree"},
                     [this] { branches().switchBranch("topic"); });
}

TEST_F(CallsOnBranches, OfASwitchLeaveTheHeadWhenItCannotBeSet)
{
    makeAhead();
    const std::string head = stateOf(repository_).head;
    expectEachRaised({"git_repository_set_head"}, [this] { branches().switchBranch("topic"); });
    EXPECT_EQ(stateOf(repository_).head, head);
}

TEST_F(CallsOnBranches, OfANewBranchAreTheseInOrder)
{
    LibGit2Recorder calls;
    branches().createBranch(git::BranchParameters("new", "main"));
    EXPECT_THAT(calls.steps(),
                ElementsAre("git_repository_open_ext", "git_reference_dwim", "git_commit_lookup",
                            "git_reference_free", "git_branch_create", "git_reference_free",
                            "git_commit_free", "git_repository_free"));
}

TEST_F(CallsOnBranches, OfANewBranchAreRaisedWhenTheyFail)
{
    const NothingChanges nothing(repository_);
    expectEachRaised({"git_repository_open_ext", "git_reference_dwim", "git_branch_create"},
                     [this] { branches().createBranch(git::BranchParameters("new", "main")); });
}

TEST_F(CallsOnBranches, OfADeletionAreTheseInOrderAndRaised)
{
    repository_.git({"branch", "old"});
    {
        const NothingChanges nothing(repository_);
        expectEachRaised({"git_repository_open_ext", "git_branch_lookup", "git_branch_delete"},
                         [this] { branches().deleteBranch("old"); });
    }
    LibGit2Recorder calls;
    branches().deleteBranch("old");
    EXPECT_THAT(calls.steps(),
                ElementsAre("git_repository_open_ext", "git_branch_lookup", "git_branch_delete",
                            "git_reference_free", "git_repository_free"));
}

TEST_F(CallsOnBranches, OfTheCurrentBranchAreTheseInOrderAndRaised)
{
    {
        LibGit2Recorder calls;
        EXPECT_EQ(branches().getCurrentBranch().getName(), "main");
        EXPECT_THAT(calls.steps(),
                    ElementsAre("git_repository_open_ext", "git_repository_head", "git_branch_name",
                                "git_reference_free", "git_repository_free"));
    }
    expectEachRaised({"git_repository_open_ext", "git_repository_head", "git_branch_name"},
                     [this] { branches().getCurrentBranch(); });
}

} // namespace
