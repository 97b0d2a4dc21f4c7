// SPDX-License-Identifier: MIT
// The calls to libgit2 of operations on branches and of merges.
#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <functional>
#include <iterator>
#include <string>
#include <tuple>
#include <utility>
#include <vector>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "BranchCallsFixture.hpp"
#include "error/logging/severity.hpp"
#include "main/callNames.hpp"
#include "support/LogCapture.hpp"
#include "support/libgit2/LibGit2Recorder.hpp"
#include "support/libgit2Release.hpp"
#include "vclink/git/messageIdentifiers.hpp"

namespace
{

namespace git = vclink::git;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::SizeIs;
using namespace vclink::test;

using CallsOnBranches = BranchCallsFixture;

TEST_F(CallsOnBranches, AreTheseInOrder)
{
    const Calls opening{"git_repository_open_ext"};
    const Calls end{"git_reference_free", "git_repository_free"};
    const auto make = [this] { branches().createBranch(git::BranchParameters("new", "main")); };
    const std::vector<std::pair<std::function<void()>, Calls>> operations{
        {[this] { branches().getLocalBranches(); },
         {"git_branch_iterator_new", "git_branch_next", "git_reference_free", "git_branch_next",
          "git_branch_iterator_free", "git_repository_free"}},
        {make,
         {"git_reference_dwim", "git_commit_lookup", "git_reference_free", "git_branch_create",
          "git_reference_free", "git_commit_free", "git_repository_free"}},
        {[this] { branches().deleteBranch("new"); },
         joined({{"git_branch_lookup", "git_transaction_new", "git_transaction_lock_ref",
                  "git_transaction_free", "git_config_open_ondisk", "git_config_foreach",
                  "git_repository_config", "git_config_new", "git_repository_set_config",
                  "git_config_free", "git_branch_delete", "git_repository_set_config",
                  "git_config_free", "git_config_free"},
                 end})},
        {[this] { branches().getCurrentBranch(); },
         joined({{"git_repository_head", "git_branch_name"}, end})}};
    for (const auto &[operation, expected] : operations)
    {
        LibGit2Recorder calls;
        operation();
        EXPECT_EQ(calls.steps(), joined({opening, expected}));
    }
}

/// Also if libgit2 gives more than it was asked for.
TEST_F(CallsOnBranches, ListNoBranchOfTheOtherSide)
{
    LibGit2Recorder calls;
    calls.answer<git_branch_next>(
        [](auto *next, git_reference **branch, git_branch_t *type, git_branch_iterator *iterator)
        {
            const int code = next(branch, type, iterator);
            *type = GIT_BRANCH_REMOTE;
            return code;
        });
    EXPECT_THAT(namesOf(branches().getLocalBranches()), IsEmpty());
    EXPECT_THAT(calls.openHandles(), IsEmpty());
}

/// git has read the branch before it was deleted, and writes its packed references afterwards.
TEST_F(CallsOnBranches, DeleteABranchAgainThatIsPackedMeanwhile)
{
    repository_.git({"branch", "packed"});
    const auto twin = makeTwin();
    twin.git({"pack-refs", "--all"});
    int deletions = 0;
    LibGit2Recorder calls;
    calls.answer<git_branch_delete>(
        [&](auto *deleteBranch, git_reference *branch)
        {
            const int code = deleteBranch(branch);
            if (++deletions == 1)
                repository_.write(".git/packed-refs", twin.read(".git/packed-refs"));
            return code;
        });
    branches().deleteBranch("packed");
    EXPECT_EQ(deletions, 2);
    EXPECT_FALSE(repository_.tryGit({"rev-parse", "--verify", "packed"}).succeeded());
}

TEST_F(CallsOnBranches, DeleteNoSettingsIfTheyFailToDeleteTheBranch)
{
    repository_.git({"branch", "topic"});
    repository_.git({"config", "branch.topic.remote", "o"});
    git_config *file = nullptr;
    int closed = 0;
    LibGit2Recorder calls;
    calls.fail({{"git_branch_delete", GIT_ERROR}});
    calls.answer<git_config_lock>(
        [&](auto *lock, git_transaction **transaction, git_config *config)
        {
            file = config;
            return lock(transaction, config);
        });
    calls.answer<git_config_free>(
        [&](auto *free, git_config *config)
        {
            closed += config == file ? 1 : 0;
            free(config);
        });
    failureOf([this] { branches().deleteBranch("topic"); });
    EXPECT_EQ(repository_.line({"config", "branch.topic.remote"}), "o");
    EXPECT_EQ(closed, libgit2_release::closesLockedFile ? 0 : 1);
}

TEST_F(CallsOnBranches, DeleteNoBranchThatIsMadeMeanwhile)
{
    repository_.git({"branch", "packed"});
    LibGit2Recorder calls;
    calls.answer<git_branch_delete>(
        [&](auto *deleteBranch, git_reference *branch)
        {
            const int code = deleteBranch(branch);
            repository_.commit("later");
            repository_.git({"branch", "packed"});
            repository_.git({"pack-refs", "--all"});
            return code;
        });
    branches().deleteBranch("packed");
    EXPECT_EQ(idOf("packed"), idOf("main"));
}

TEST_F(CallsOnBranches, OfASwitchAreTheseInOrderWithTheRecordOfASafeCheckout)
{
    makeAhead();
    LibGit2Recorder calls;
    collectRecords(calls);
    branches().switchBranch("topic");
    EXPECT_EQ(calls.steps(),
              joined({{"git_repository_open_ext", "git_index_open", "git_repository_set_index",
                       "git_index_set_caps", "git_index_free", "git_branch_lookup",
                       "git_reference_name_to_id", "git_revparse_single", "git_reference_peel",
                       "git_object_peel", "git_object_free", "git_object_free",
                       "git_branch_is_checked_out", "git_repository_state"},
                      ofTheSettings,
                      {"git_checkout_options_init"},
                      lookBeforeASwitch_,
                      {"git_transaction_new", "git_transaction_lock_ref", "git_transaction_free",
                       "git_reference_name_to_id", "git_checkout_tree", "git_reference_name_to_id",
                       "git_repository_set_head"},
                      endOfTheLook_,
                      {"git_object_free", "git_reference_free", "git_repository_free"}}));
    ASSERT_THAT(checkouts_, SizeIs(1));
    expectCheckoutRecord(checkouts_[0], libgit2_release::safeCheckout);
    EXPECT_THAT(checkoutPaths_[0], IsEmpty());
}

class CallsOfAMerge : public BranchCallsFixture
{
  protected:
    void makeConflicts()
    {
        repository_.commitAll(writes(".gitattributes", "binary -merge\n") +
                                  writes("binary", "ancestor\n"),
                              "attributes");
        diverge(writes("file", "ours\n") + writes("binary", "ours\n"),
                writes("file", "theirs\n") + writes("binary", "theirs\n"));
    }
    /// Expects the values that libgit2 gives.
    static void expectUnchanged(const git_merge_options &options)
    {
        git_merge_options initial;
        git_merge_options_init(&initial, GIT_MERGE_OPTIONS_VERSION);
        const auto members = [](const git_merge_options &from)
        {
            return std::tie(from.version, from.flags, from.rename_threshold, from.target_limit,
                            from.metric, from.recursion_limit, from.default_driver, from.file_favor,
                            from.file_flags);
        };
        EXPECT_EQ(members(options), members(initial));
    }
};

TEST_F(CallsOfAMerge, OfAFastForwardAreTheseInOrder)
{
    makeAhead();
    LibGit2Recorder calls;
    collectRecords(calls);
    calls.on<git_reference_set_target>(
        [](git_reference **, git_reference *, const git_oid *, const char *message)
        { EXPECT_EQ(message, nullptr) << "and nothing for the reflog"; });
    merge("topic");
    EXPECT_EQ(calls.steps(),
              joined({{"git_repository_open_ext", "git_repository_state"},
                      ofTheSettings,
                      {"git_revparse_single", "git_oid_cpy", "git_object_free",
                       "git_annotated_commit_lookup", "git_merge_analysis", "git_index_open",
                       "git_repository_set_index", "git_index_set_caps", "git_index_free",
                       "git_repository_state", "git_repository_head", "git_graph_descendant_of",
                       "git_object_lookup", "git_checkout_options_init"},
                      lookBeforeASwitch_,
                      {"git_transaction_new", "git_transaction_lock_ref", "git_transaction_free",
                       "git_repository_head", "git_reference_free", "git_checkout_tree",
                       "git_reference_set_target", "git_reference_free"},
                      endOfTheLook_,
                      {"git_object_free", "git_reference_free", "git_annotated_commit_free",
                       "git_repository_free"}}));
    ASSERT_THAT(checkouts_, SizeIs(1));
    expectCheckoutRecord(checkouts_[0], libgit2_release::safeCheckout);
    EXPECT_THAT(checkoutPaths_[0], IsEmpty());
}

TEST_F(CallsOfAMerge, OfAMergeThatIsUpToDateStopAtTheAnalysis)
{
    LibGit2Recorder calls;
    merge("main");
    EXPECT_EQ(calls.steps(), joined({{"git_repository_open_ext", "git_repository_state"},
                                     ofTheSettings,
                                     {"git_revparse_single", "git_oid_cpy", "git_object_free",
                                      "git_annotated_commit_lookup", "git_merge_analysis",
                                      "git_annotated_commit_free", "git_repository_free"}}));
}

TEST_F(CallsOfAMerge, OfAMergeThatFailsReleaseAllBeforeTheExceptionIsMade)
{
    makeDiverged();
    LibGit2Recorder calls;
    calls.fail({{"git_merge", GIT_ERROR}});
    LogCapture log(git::SeverityException);
    std::string last;
    log.onRecord([&](const LogRecord &) { last = calls.steps().back(); });
    failureOfMerge("topic");
    EXPECT_EQ(last, "git_repository_free");
}

/// No bit is set then, and the merge is a true one.
TEST_F(CallsOfAMerge, OfTheAnalysisMayFail)
{
    makeAhead();
    const std::string head = idOf("HEAD");
    {
        LibGit2Recorder calls;
        calls.fail({{"git_merge_analysis", GIT_ERROR}});
        const LogCapture log(git::SeverityDiagnostic);
        merge("topic");
        EXPECT_THAT(log.messages(),
                    testing::IsSupersetOf({"Merge Analysis: ", "Merge Preference: "}));
    }
    EXPECT_THAT(parents(), ElementsAre(head, idOf("topic")));
}

TEST_F(CallsOfAMerge, OfTheAnalysisDecideByTheirFirstBitAndByThePreferenceWithoutAny)
{
    makeDiverged();
    const NothingChanges nothing(repository_);
    unsigned bits = GIT_MERGE_ANALYSIS_UNBORN | GIT_MERGE_ANALYSIS_FASTFORWARD;
    LibGit2Recorder calls;
    calls.answer<git_merge_analysis>(
        [&](auto, git_merge_analysis_t *analysis, git_merge_preference_t *preference, auto...)
        {
            *analysis = static_cast<git_merge_analysis_t>(bits);
            *preference = GIT_MERGE_PREFERENCE_FASTFORWARD_ONLY;
            return 0;
        });
    EXPECT_EQ(failureOfMerge("topic"), "GIT_MERGE_ANALYSIS_UNBORN");
    bits |= GIT_MERGE_ANALYSIS_UP_TO_DATE;
    EXPECT_NO_THROW(merge("topic"));
    bits = 0;
    EXPECT_EQ(failureOfMerge("topic"), textOf(shared_vclink::git::MergePreferenceFastForward()));
}

/// Those of a merge that has no conflicts, before the commit.
TEST_F(CallsOfAMerge, OfACleanMergeAreTheseInOrder)
{
    makeDiverged();
    LibGit2Recorder calls;
    collectRecords(calls);
    merge("topic");
    const Calls expected =
        joined({{"git_repository_open_ext", "git_repository_state"},
                ofTheSettings,
                {"git_revparse_single", "git_oid_cpy", "git_object_free",
                 "git_annotated_commit_lookup", "git_merge_analysis", "git_checkout_options_init",
                 "git_merge_options_init", "git_index_open", "git_repository_set_index",
                 "git_index_set_caps", "git_index_free", "git_repository_state"},
                lookBeforeAMerge_,
                {"git_repository_head", "git_transaction_new", "git_transaction_lock_ref",
                 "git_transaction_free", "git_reference_free", "git_reference_name_to_id",
                 "git_oid_fmt", "git_oid_fmt", "git_merge", "git_oid_fmt", "git_repository_index",
                 "git_index_has_conflicts", "git_reference_dwim", "git_reference_free",
                 "git_repository_open_ext"}});
    ASSERT_GE(calls.steps().size(), expected.size());
    const auto size = static_cast<std::ptrdiff_t>(expected.size());
    const Calls first(calls.steps().begin(), calls.steps().begin() + size);
    EXPECT_EQ(first, expected);
    const Calls last(calls.steps().end() - 5, calls.steps().end());
    EXPECT_EQ(last, joined({{"git_index_free"},
                            endOfTheLook_,
                            {"git_annotated_commit_free", "git_repository_free"}}));
    ASSERT_THAT(checkouts_, SizeIs(1));
    expectCheckoutRecord(checkouts_[0], 18);
    EXPECT_THAT(checkoutPaths_[0], IsEmpty());
    expectUnchanged(merges_.at(0));
}

TEST_F(CallsOfAMerge, OfConflictsAreTheseInOrderAndTheSecondCheckoutTakesOurs)
{
    makeConflicts();
    LibGit2Recorder calls;
    collectRecords(calls);
    calls.on<git_attr_get>([](const char **, git_repository *, std::uint32_t flags, const char *,
                              const char *) { EXPECT_EQ(flags, 0U); });
    expectConflicts("topic");
    const auto begin =
        std::find(calls.steps().begin(), calls.steps().end(), "git_index_has_conflicts");
    const auto end = std::find(begin, calls.steps().end(), "git_repository_free");
    EXPECT_EQ(std::count(begin, end, "git_attr_get"), 12) << "two attributes of three stages twice";
    Calls others;
    std::copy_if(begin, end, std::back_inserter(others),
                 [](const std::string &name) { return name.rfind("git_attr_", 0) != 0; });
    EXPECT_THAT(others, ElementsAre("git_index_has_conflicts", "git_index_conflict_iterator_new",
                                    "git_index_conflict_next", "git_index_conflict_next",
                                    "git_index_conflict_next", "git_index_conflict_iterator_free",
                                    "git_checkout_index", "git_index_free", "git_tree_free",
                                    "git_index_free", "git_annotated_commit_free"));
    ASSERT_THAT(checkouts_, SizeIs(2));
    expectCheckoutRecord(checkouts_[0], 18);
    expectCheckoutRecord(checkouts_[1], 18 | 2048);
    EXPECT_THAT(checkoutPaths_[0], IsEmpty());
    EXPECT_THAT(checkoutPaths_[1], ElementsAre("binary", "binary", "binary"))
        << "once for each stage";
}

TEST_F(CallsOfAMerge, OfTheSecondCheckoutAreToldInPlaceOfTheConflicts)
{
    makeConflicts();
    LibGit2Recorder calls;
    calls.fail({{"git_checkout_index", GIT_ERROR}});
    EXPECT_EQ(failureOfMerge("topic"), textOf(injected_));
    EXPECT_EQ(branches().getRepositoryState(), "Conflicts");
    EXPECT_THAT(repository_.read("binary"), testing::HasSubstr("<<<<<<<"));
}

TEST_F(CallsOfAMerge, OfAttributesMayFailAndCountAsNoAttribute)
{
    makeConflicts();
    LibGit2Recorder calls;
    collectRecords(calls);
    calls.fail({{"git_attr_get", GIT_ERROR}});
    const LogCapture log(git::SeverityDiagnostic);
    expectConflicts("topic");
    EXPECT_THAT(checkouts_, SizeIs(1));
    EXPECT_THAT(repository_.read("binary"), testing::HasSubstr("<<<<<<<"));
}

} // namespace
