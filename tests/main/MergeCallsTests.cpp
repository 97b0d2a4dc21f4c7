// SPDX-License-Identifier: MIT
// The calls to libgit2 of a merge.
#include <algorithm>
#include <iterator>
#include <string>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "BranchCallsTest.hpp"
#include "error/logging/severity.hpp"
#include "support/LogCapture.hpp"
#include "vclink/git/messageIdentifiers.hpp"

namespace
{

namespace git = vclink::git;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::SizeIs;
using vclink::test::BranchCalls;
using vclink::test::LogCapture;
using vclink::test::NothingChanges;
using vclink::test::textOf;

class CallsOfAMerge : public vclink::test::BranchCallsTest
{
  protected:
    void makeConflicts()
    {
        repository_.write(".gitattributes", "binary -merge\n");
        repository_.write("binary", "ancestor\n");
        repository_.commitAll("attributes");
        diverge(
            [this]
            {
                repository_.write("file", "ours\n");
                repository_.write("binary", "ours\n");
            },
            [this]
            {
                repository_.write("file", "theirs\n");
                repository_.write("binary", "theirs\n");
            });
    }
    static void expectBalance(const Calls &calls, const char *made, const char *freed)
    {
        EXPECT_EQ(std::count(calls.begin(), calls.end(), made),
                  std::count(calls.begin(), calls.end(), freed))
            << made;
    }
    /// Expects that a failure of each call fails the merge, with all released.
    void expectEachFailsTheMerge(const Calls &names) const
    {
        for (const auto &name : names)
        {
            BranchCalls calls;
            calls.failing[name] = GIT_ERROR;
            EXPECT_EQ(failureOfMerge("topic"), textOf(injected_)) << name;
            if (name != "annotated_commit_lookup")
                expectBalance(calls.names, "annotated_commit_lookup", "annotated_commit_free");
        }
    }
};

TEST_F(CallsOfAMerge, OfAFastForwardAreTheseInOrder)
{
    makeAhead();
    BranchCalls calls;
    merge("topic");
    EXPECT_THAT(calls.names,
                ElementsAre("repository_open_ext", "repository_state", "revparse_single",
                            "object_free", "annotated_commit_lookup", "merge_analysis",
                            "repository_head", "object_lookup", "checkout_tree",
                            "reference_set_target", "reference_free", "object_free",
                            "reference_free", "annotated_commit_free", "repository_free"))
        << "and nothing for the reflog";
    ASSERT_THAT(calls.checkouts, SizeIs(1));
    expectCheckoutRecord(calls.checkouts[0], 1);
    EXPECT_THAT(calls.checkoutPaths[0], IsEmpty());
}

TEST_F(CallsOfAMerge, OfAFastForwardFailTheMergeWhenTheyFail)
{
    makeAhead();
    {
        const NothingChanges nothing(repository_);
        expectEachFailsTheMerge({"repository_open_ext", "revparse_single",
                                 "annotated_commit_lookup", "repository_head", "object_lookup",
                                 "checkout_tree"});
    }
    const std::string main = idOf("main");
    expectEachFailsTheMerge({"reference_set_target"});
    EXPECT_EQ(idOf("main"), main);
}

TEST_F(CallsOfAMerge, OfAMergeThatIsUpToDateStopAtTheAnalysis)
{
    BranchCalls calls;
    merge("main");
    EXPECT_THAT(calls.names,
                ElementsAre("repository_open_ext", "repository_state", "revparse_single",
                            "object_free", "annotated_commit_lookup", "merge_analysis",
                            "annotated_commit_free", "repository_free"));
}

TEST_F(CallsOfAMerge, OfAMergeThatFailsReleaseAllBeforeTheExceptionIsMade)
{
    makeDiverged();
    BranchCalls calls;
    calls.failing["merge"] = GIT_ERROR;
    LogCapture log(git::SeverityException);
    std::string last;
    log.onRecord([&](const vclink::test::LogRecord &) { last = calls.names.back(); });
    failureOfMerge("topic");
    EXPECT_EQ(last, "repository_free");
}

TEST_F(CallsOfAMerge, OfAMergeUnderWayStopAtTheState)
{
    BranchCalls calls;
    calls.failing["repository_state"] = GIT_REPOSITORY_STATE_REBASE;
    EXPECT_EQ(failureOfMerge("topic"),
              textOf(shared_vclink::git::UnableToMergeBadRepositoryState()));
    EXPECT_THAT(calls.names,
                ElementsAre("repository_open_ext", "repository_state", "repository_free"));
}

/// No bit is set then, and the merge is a true one.
TEST_F(CallsOfAMerge, OfTheAnalysisMayFail)
{
    makeAhead();
    const std::string head = idOf("HEAD");
    {
        BranchCalls calls;
        calls.failing["merge_analysis"] = GIT_ERROR;
        const LogCapture log(git::SeverityDiagnostic);
        merge("topic");
        EXPECT_THAT(log.messages(),
                    testing::IsSupersetOf({"Merge Analysis: ", "Merge Preference: "}));
    }
    EXPECT_THAT(parents(), ElementsAre(head, idOf("topic")));
}

/// Those of a merge that has no conflicts, before the commit.
TEST_F(CallsOfAMerge, OfACleanMergeAreTheseInOrder)
{
    makeDiverged();
    BranchCalls calls;
    merge("topic");
    ASSERT_GE(calls.names.size(), 12U);
    const Calls first(calls.names.begin(), calls.names.begin() + 12);
    EXPECT_THAT(first, ElementsAre("repository_open_ext", "repository_state", "revparse_single",
                                   "object_free", "annotated_commit_lookup", "merge_analysis",
                                   "merge", "repository_index", "index_has_conflicts",
                                   "reference_dwim", "reference_free", "repository_open_ext"));
    const Calls last(calls.names.end() - 3, calls.names.end());
    EXPECT_THAT(last, ElementsAre("index_free", "annotated_commit_free", "repository_free"));
    ASSERT_THAT(calls.checkouts, SizeIs(1));
    expectCheckoutRecord(calls.checkouts[0], 18);
    EXPECT_THAT(calls.checkoutPaths[0], IsEmpty());
    EXPECT_EQ(calls.changedMergeOptions, 0);
}

TEST_F(CallsOfAMerge, OfACleanMergeFailItWhenTheyFail)
{
    makeDiverged();
    const NothingChanges nothing(repository_);
    expectEachFailsTheMerge(
        {"repository_open_ext", "revparse_single", "annotated_commit_lookup", "merge"});
}

TEST_F(CallsOfAMerge, OfTheIndexFailTheMergeThatStandsByThen)
{
    makeDiverged();
    const std::string head = idOf("HEAD");
    expectEachFailsTheMerge({"repository_index"});
    EXPECT_EQ(idOf("HEAD"), head);
    EXPECT_EQ(idOf("MERGE_HEAD"), idOf("topic"));
    EXPECT_EQ(branches().getRepositoryState(), "Conflicts");
}

TEST_F(CallsOfAMerge, OfConflictsAreTheseInOrder)
{
    makeConflicts();
    BranchCalls calls;
    expectConflicts("topic");
    const auto begin = std::find(calls.names.begin(), calls.names.end(), "index_has_conflicts");
    const auto end = std::find(begin, calls.names.end(), "repository_free");
    EXPECT_EQ(std::count(begin, end, "attr_get"), 12) << "two attributes of three stages twice";
    Calls others;
    std::copy_if(begin, end, std::back_inserter(others),
                 [](const std::string &name) { return name.rfind("attr_", 0) != 0; });
    EXPECT_THAT(others, ElementsAre("index_has_conflicts", "index_conflict_iterator_new",
                                    "index_conflict_next", "index_conflict_next",
                                    "index_conflict_next", "index_conflict_iterator_free",
                                    "checkout_index", "index_free", "annotated_commit_free"));
    EXPECT_THAT(calls.attributeFlags, testing::Each(0U));
}

TEST_F(CallsOfAMerge, OfTheSecondCheckoutTakeTheFirstOnesRecordAndOurs)
{
    makeConflicts();
    BranchCalls calls;
    expectConflicts("topic");
    ASSERT_THAT(calls.checkouts, SizeIs(2));
    expectCheckoutRecord(calls.checkouts[0], 18);
    expectCheckoutRecord(calls.checkouts[1], 18 | 2048);
    EXPECT_THAT(calls.checkoutPaths[0], IsEmpty());
    EXPECT_THAT(calls.checkoutPaths[1], ElementsAre("binary", "binary", "binary"))
        << "once for each stage";
}

TEST_F(CallsOfAMerge, OfTheSecondCheckoutAreToldInPlaceOfTheConflicts)
{
    makeConflicts();
    const std::string head = idOf("HEAD");
    expectEachFailsTheMerge({"checkout_index"});
    EXPECT_EQ(idOf("HEAD"), head);
    EXPECT_EQ(branches().getRepositoryState(), "Conflicts");
    EXPECT_THAT(repository_.read("binary"), testing::HasSubstr("<<<<<<<"));
}

TEST_F(CallsOfAMerge, OfTheWalkOverConflictsFailTheMerge)
{
    makeConflicts();
    for (const std::string name : {"index_conflict_iterator_new", "index_conflict_next"})
    {
        expectEachFailsTheMerge({name});
        EXPECT_EQ(branches().getRepositoryState(), "Conflicts") << name;
        repository_.git({"merge", "--abort"});
    }
}

TEST_F(CallsOfAMerge, OfAttributesMayFailAndCountAsNoAttribute)
{
    makeConflicts();
    BranchCalls calls;
    calls.failing["attr_get"] = GIT_ERROR;
    const LogCapture log(git::SeverityDiagnostic);
    expectConflicts("topic");
    EXPECT_THAT(calls.checkouts, SizeIs(1));
    EXPECT_THAT(repository_.read("binary"), testing::HasSubstr("<<<<<<<"));
}

} // namespace
